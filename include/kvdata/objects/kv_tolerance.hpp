#pragma once
// One named tolerance, kept as a fixed 748-byte record whose bytes are also
// its stream image: identifier, name, description, four limits and a free
// text. Tolerance sets stream their members one after another this way.
//
//   auto tol = kvdata::KVTolerance::create();
//   tol->ID(5);  tol->MaxFail(1.5);  tol->StreamOut(bytes, pos);   // 749 bytes, pos += 749

#include <array>
#include <cstddef>
#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/ikv_tolerance.hpp"

namespace kvdata {

// Text fields hold 50 (TolName, Misc) or 255 (Description) UTF-16 code units:
// a longer text is cut, a shorter one padded with blanks; getters remove
// leading and trailing blanks. A new tolerance has ID 0, all limits 0 and
// texts of U+0000 units. Limits are stored as given and never compared.
//
// Stream image: the 748 record bytes and one trailing 0, 749 bytes in all.
// StreamLen reports the record's 748.
//  - StreamOut grows the array (to run from index 0) so that it reaches
//    Position + 749 when it ends earlier; a longer array keeps its length and
//    the bytes after the tolerance. An array never given bounds counts as
//    empty. On a failure (a Position outside the array, an array that cannot
//    grow, a Position past the Long range) it raises an error keeping the
//    failure's number and source, described as "Error <step> while streaming
//    out tolerance: <the failure's text>"; bytes written stay written.
//  - StreamIn reads the 749 bytes and keeps the first 748 as its record. When
//    the array ends first it returns False with the record unchanged and
//    Position advanced by the bytes it could read.
class KVTolerance final : public IKVStream, public IKVTolerance {
 public:
  static constexpr std::size_t kRecordBytes = 748;
  static constexpr std::size_t kStreamBytes = kRecordBytes + 1;

  static std::shared_ptr<KVTolerance> create();

 private:
  bool IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) override;
  bool IKVStream_StreamOut(ByteArray& bytStream, Long& Position) override;
  Long IKVStream_StreamLen() const override;

  Long IKVTolerance_ID() const override;
  void IKVTolerance_ID(Long value) override;
  String IKVTolerance_TolName() const override;
  void IKVTolerance_TolName(const String& value) override;
  String IKVTolerance_Description() const override;
  void IKVTolerance_Description(const String& value) override;
  Double IKVTolerance_MinFail() const override;
  void IKVTolerance_MinFail(Double value) override;
  Double IKVTolerance_MinWarn() const override;
  void IKVTolerance_MinWarn(Double value) override;
  Double IKVTolerance_MaxWarn() const override;
  void IKVTolerance_MaxWarn(Double value) override;
  Double IKVTolerance_MaxFail() const override;
  void IKVTolerance_MaxFail(Double value) override;
  String IKVTolerance_Misc() const override;
  void IKVTolerance_Misc(const String& value) override;

  std::array<Byte, kRecordBytes> record_{};
};

}  // namespace kvdata
