#include "objects/detail/block_stream.hpp"

#include <algorithm>

#include "kvdata/automation/error.hpp"
#include "streams/detail/little_endian.hpp"

namespace kvdata::detail {

bool read_block(const ByteArray& stream, Long& position, std::span<Byte> block) {
  const std::size_t taken = std::min(bytes_from(stream, position), block.size());
  const long long end = static_cast<long long>(position) + static_cast<long long>(taken);
  if (end > kLongMax) {
    // The last byte sits at the largest index: Position cannot move past it.
    position = kLongMax;
    return false;
  }
  if (taken < block.size()) {
    position = static_cast<Long>(end);
    return false;
  }
  const auto bytes = window(stream, position, taken);
  if (!bytes || !store_bytes(block, 0, *bytes)) return false;
  position = static_cast<Long>(end);
  return true;
}

bool size_stream_to_end(ByteArray& stream, Long position, std::size_t n) {
  if (position < 0 || n > static_cast<std::size_t>(kLongMax - position)) return false;
  try {
    stream.redim_preserve(0, position + static_cast<Long>(n));
  } catch (const Error&) {
    return false;
  }
  return true;
}

bool write_block(ByteArray& stream, Long& position, std::span<const Byte> block) {
  if (position < 0 || block.size() > static_cast<std::size_t>(kLongMax - position)) return false;
  const auto bytes = window(stream, position, block.size());
  if (!bytes || !store_bytes(*bytes, 0, block)) return false;
  position += static_cast<Long>(block.size());
  return true;
}

}  // namespace kvdata::detail
