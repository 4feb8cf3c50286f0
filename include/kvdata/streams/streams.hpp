#pragma once
// Record streams: the shared records encoded into byte streams and decoded
// again, one whole record per call, at a running Position that ends up just
// past the record. Several records can follow one another in one stream.
// Most records are sequences of field-codec values; users and organisations
// are fixed-size blocks of a flat image with fixed-width UTF-16 text.
// The class has no state; `Streams::instance()` is its predeclared instance.
// Threads: any number of threads may call it, the predeclared instance
// included, at once, each with arrays and records of its own.
//
//   kvdata::ByteArray bytes(0, -1);  kvdata::Long pos = 0;
//   kvdata::Streams::instance().Stream_Station(kvdata::eStreamDirection::ToStream, bytes, pos, st);
//
// Common rules of every Stream_ operation:
// - Direction ToStream writes the record at Position, FromStream reads it;
//   any other value does nothing and returns False.
// - Writers grow the stream value by value (never shrinking it); fixed-size
//   blocks do not grow it.
// - False never undoes what was done: bytes written stay, Position stays
//   where it was advanced to.
// - A value that cannot be written or read (stream without bounds, Position
//   outside it, stream too short) logs its one event-log entry and the
//   operation stops there and returns False.

#include <cstddef>
#include <memory>

#include "kvdata/automation/array.hpp"
#include "kvdata/automation/object.hpp"
#include "kvdata/automation/types.hpp"
#include "kvdata/foundation/enums.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

class Streams : public Object {
 public:
  // The streams whose size never varies: an SC pair, a user block and an
  // organisation block. A reader takes exactly these bytes, so a program
  // holding a longer file need read no more of it.
  static constexpr std::size_t kSCPairBytes = 320;
  static constexpr std::size_t kUserBlockBytes = 261;
  static constexpr std::size_t kOrganizationBlockBytes = 133;

  static std::shared_ptr<Streams> create();
  // The predeclared instance, usable without creating one.
  static Streams& instance();

  // Spectrum(SCE).Data(1..40) then Spectrum(SCI).Data(1..40): 80 Singles,
  // 320 bytes. The reader stores each value into SCP as it is read, so a
  // short stream leaves the values before the failure replaced.
  bool Stream_SCPair(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                     tSCPair& SCP);

  // A tile set and its calibration in one stream: TSN, tile count N, N times
  // (Name, ColorRGB, TempComp), Certified, TempCalibrated, N SC pairs.
  // Writing needs TS.TSN == TSC.TSN (case-sensitive), TS.Tiles with bounds
  // inside 0..254 and 1 to 254 tiles, and TSC.Tiles holding every index of
  // TS.Tiles; otherwise nothing is written and the result is False.
  // Reading needs a count of 1 to 254 that fits in the bytes left; the
  // records read get Tiles indices 1..N and replace TS and TSC as a whole
  // only when everything was read (otherwise both stay unchanged).
  bool Stream_TileSetCalibration(const eStreamDirection& Direction, ByteArray& Stream,
                                 Long& Position, tTileSet& TS, tTileSetCalibration& TSC);

  // ISN, Created, Validated, the type name "tOVProfileDataV1", then the 320
  // table values interleaved: for SCE then SCI, for band 1..40, wCal, wave,
  // Linear, Dark. Writing needs pro.ProfileData to hold a tOVProfileDataV1,
  // otherwise nothing is written. Reading stores ISN, Created and Validated
  // directly; any other type name returns False with ProfileData unchanged;
  // ProfileData is replaced only when all 320 values were read.
  bool Stream_Profile(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                      tOVProfile& pro);

  // StationGUID, StationName, StationMail; the reader stores each directly.
  bool Stream_Station(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                      tStation& Station);

  // A test run without its light-level spectra: ISN, UserNumber,
  // StationGUID, TestDate, Comment, four test statistics (Stats,
  // CommunicationsTest, LightLevels.Stats, Repeatability.Stats; each
  // TestResult, TestExplain, TestStart, TestEnd), blue-tile spectrum, max,
  // drift, RMS, white-tile spectrum, max, drift, RMS, IIA.Stats,
  // IIA.CalStandard, IIA.TSN, Has2Measurement, then one series (two when
  // Has2Measurement): Profile, a 16-bit tile count, and per tile for SCE
  // then SCI, for band 1..40, Trial and TrialProfiled value by value.
  // Writing: a series whose Tiles has no bounds is written as 0 tiles; more
  // than 32767 tiles, or bounds outside the 16-bit range, refuse the whole
  // record before anything is written. Reading: a count that does not fit
  // in the bytes left is refused; a count of 0 or less gives a series without
  // bounds, otherwise Tiles 1..K. TR is replaced as a whole only when
  // everything was read (light-level spectra zero, a missing second series
  // empty); otherwise it stays unchanged.
  bool Stream_TestRun(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                      tTestRun1& TR);

  // A 261-byte block: the first 261 bytes of a flat 264-byte image (USERID
  // 8 units, UserNumber, LastName 30, FirstName 30, UserPWD 8, UserMail 50,
  // OrgID, RoleCode 1 unit, Disabled 1 unit). Only the low byte of RoleCode
  // travels and Disabled does not travel at all: it always reads back as one
  // U+0000 character. Callers who need Disabled use the user object's own
  // stream. Texts are cut or padded with blanks when written and have their
  // blanks trimmed when read. The block never grows the stream: when fewer
  // than 261 bytes are left, the bytes that fit are written (or consumed),
  // Position moves past them and the result is False; User changes only once
  // all 261 bytes were read.
  bool Stream_User(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                   tUser& User);

  // Writes the stream's elements from lower to upper bound to the file by
  // FileOutput's policy (file_output.hpp): a regular file is replaced whole
  // (written beside it and renamed over it, keeping its permissions), so a
  // failure leaves any earlier file as it was; a link is followed; a device
  // or FIFO is written in place. False on any failure (including an array
  // without bounds); nothing is logged.
  bool StreamSave(const String& Filename, const ByteArray& a);

  // Reads the whole file into an array with indices 1..length. A missing,
  // empty or unreadable file, or one longer than a stream can be (beyond the
  // highest Long), gives False and leaves `a` unchanged; the length is
  // checked before anything is read.
  bool StreamLoad(const String& Filename, ByteArray& a);

  // The 133-byte organisation block through StreamOrgTo / StreamOrgFrom;
  // their False is passed on.
  bool Stream_Organization(const eStreamDirection& Direction, ByteArray& Stream, Long& Position,
                           tOrganization& Org);

  // Writes the 133-byte block: ID, Organization 50 units, ParentOrgID,
  // RootOrgID, Alias 8 units, Avail 1 unit, three zero bytes. Texts are cut
  // or padded with blanks. The stream does not grow: when fewer than 133
  // bytes are left, those that fit are written, Position moves past them and
  // the result is False.
  bool StreamOrgTo(const tOrganization& Org, ByteArray& Stream, Long& Position);

  // Reads the 133-byte block, trimming blanks from the texts and ignoring
  // the three trailing bytes. When fewer than 133 bytes are left, Position
  // moves past those consumed, the result is False and Org is unchanged.
  bool StreamOrgFrom(tOrganization& Org, const ByteArray& Stream, Long& Position);

 private:
  Streams() = default;
};

}  // namespace kvdata
