#include "objects/detail/object_stream.hpp"

#include <algorithm>

#include "kvdata/automation/error.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {
namespace {

// True when a block of `n` bytes at `position` ends inside the Long range.
bool ends_in_range(Long position, std::size_t n) {
  return n <= static_cast<std::size_t>(kLongMax) &&
         static_cast<long long>(position) <= kLongMax - static_cast<long long>(n);
}

}  // namespace

Long index_after(Long position, std::size_t n) {
  if (!ends_in_range(position, n)) raise(kOverflow);
  return static_cast<Long>(static_cast<long long>(position) + static_cast<long long>(n));
}

Long writer_upper_bound(const ByteArray& stream) {
  return stream.has_bounds() ? stream.ubound() : -1;
}

void resize_stream(ByteArray& stream, Long upper) {
  stream.redim_preserve(0, upper);
}

void grow_stream(ByteArray& stream, Long upper) {
  if (writer_upper_bound(stream) < upper) resize_stream(stream, upper);
}

bool put_block(ByteArray& stream, Long& position, std::span<const Byte> block) {
  if (!ends_in_range(position, block.size())) return false;
  const auto target = window(stream, position, block.size());
  if (!target || !store_bytes(*target, 0, block)) return false;
  position =
      static_cast<Long>(static_cast<long long>(position) + static_cast<long long>(block.size()));
  return true;
}

bool take_block(const ByteArray& stream, Long& position, std::span<Byte> block) {
  if (!ends_in_range(position, block.size())) return false;
  const std::size_t taken = std::min(block.size(), bytes_from(stream, position));
  if (taken > 0) {
    const auto source = window(stream, position, taken);
    if (!source || !store_bytes(block, 0, *source)) return false;
  }
  position = static_cast<Long>(static_cast<long long>(position) + static_cast<long long>(taken));
  return taken == block.size();
}

}  // namespace kvdata::detail
