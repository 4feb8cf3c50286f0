#pragma once
// One test run of an instrument: the whole tTestRun1 record plus a free text
// of light-level data that travels after it in the byte stream. The
// persistence verbs and rights exist but are inert in this library.
//
//   auto run = kvdata::KVTestRun::create();
//   run->v1TestRun(record);  run->LightLevelData(u"...");  run->StreamOut(bytes, pos);
//
// Stream form, from Position: the stream version (Single, 1.4 on a new
// object), the test-run record stream, then LightLevelData as a String,
// present only after a record that went through. The record stream leaves
// out the eight light-level spectra, so a decoded run has them zero.

#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/automation/variant.hpp"
#include "kvdata/foundation/ikv_db_object.hpp"
#include "kvdata/foundation/ikv_obj.hpp"
#include "kvdata/foundation/ikv_security.hpp"
#include "kvdata/foundation/ikv_stream.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// Identity: ObjType "TestRun", Description "Test Run", ID a String Variant
// holding the record's ISN, DateCreated a Date Variant holding its TestDate.
//
// StreamOut refuses a negative Position, or one so large that Position +
// 20000 passes the Long range: False, with the stream and Position unchanged.
// Otherwise it sets the stream to run from 0 to Position + 20000 (working
// room), writes the version and the record, LightLevelData only when the
// record went through, and cuts the stream to run from 0 to the final
// Position (one spare byte after the encoding), also after a failure. The
// result is False when the record or a value could not be written; errors
// of the resize (no memory) reach the caller.
//
// StreamIn refuses a negative Position (False, nothing read). The version it
// reads is not checked: it becomes the version the next StreamOut writes.
// The record is replaced only when it was read whole; LightLevelData only
// after that, and only when its text was read whole. The result is False at
// the first part that could not be read; what was replaced before stays so.
//
// StreamLen is the Position that StreamOut reaches from 0 in a new array;
// the object is not changed.
class KVTestRun : public IKVObj, public IKVStream, public InertDBObject, public InertSecurity {
 public:
  static std::shared_ptr<KVTestRun> create();

  // A deep copy of the record, nested records and arrays included.
  tTestRun1 v1TestRun() const { return record_; }
  // Replaces the record with a deep copy of `value`.
  void v1TestRun(const tTestRun1& value) { record_ = value; }
  // Stores the text unchanged; it travels after the record.
  void LightLevelData(const String& value) { light_level_data_ = value; }
  // The text as set or last read (not part of the automation interface,
  // which can only set it).
  const String& LightLevelData() const { return light_level_data_; }
  // The stream version StreamOut writes: 1.4 when new, otherwise the version
  // last read or set.
  Single StreamVersion() const { return version_; }
  void StreamVersion(Single value) { version_ = value; }

 protected:
  String IKVObj_ObjType() const override;
  String IKVObj_Description() const override;
  Variant IKVObj_ID() const override;
  Variant IKVObj_DateCreated() const override;

  bool IKVStream_StreamIn(const ByteArray& bytStream, Long& Position) override;
  bool IKVStream_StreamOut(ByteArray& bytStream, Long& Position) override;
  Long IKVStream_StreamLen() const override;

 private:
  KVTestRun() = default;

  tTestRun1 record_;
  Single version_ = 1.4f;
  String light_level_data_;
};

}  // namespace kvdata
