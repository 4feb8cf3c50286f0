// The record kinds, through the predeclared Streams instance.
#include "json/fields.hpp"
#include "json/records.hpp"
#include "kvdata/streams/streams.hpp"
#include "support/errors.hpp"
#include "support/library_log.hpp"
#include "wire/codec.hpp"
#include "wire/codec_parts.hpp"

namespace kvdata::cli::codec {
namespace {

constexpr Long kUserBlockBytes = 261;
constexpr Long kOrganizationBlockBytes = 133;

[[noreturn]] void refused(const char* what, const std::string& why, const LibraryLog& log) {
  bad_input(std::string("the library's ") + what + " " + why + log.summary());
}

// Runs one Stream_ operation reading from position 0 of `a`.
template <class Op>
void read_with(const char* what, const ByteArray& a, Op op) {
  ByteArray copy = a;
  Long pos = copy.has_bounds() ? copy.lbound() : 0;
  LibraryLog log;
  if (!op(copy, pos)) refused(what, "reader refused the stream", log);
}

// Runs one Stream_ operation writing into `a` (sized beforehand for the
// fixed blocks, which do not grow the stream) and returns the bytes written.
template <class Op>
std::vector<Byte> write_with(const char* what, Long presize, Op op) {
  ByteArray a(0, presize - 1);
  Long pos = 0;
  LibraryLog log;
  if (!op(a, pos)) refused(what, "writer refused the record", log);
  return from_array(a, 0, pos);
}

Streams& streams() {
  return Streams::instance();
}

constexpr auto kFrom = eStreamDirection::FromStream;
constexpr auto kTo = eStreamDirection::ToStream;

}  // namespace

bool decode_record_stream(StreamKind kind, const ByteArray& a, Json& doc) {
  switch (kind) {
    case StreamKind::SCPair: {
      tSCPair r;
      read_with("SC pair", a,
                [&](ByteArray& s, Long& p) { return streams().Stream_SCPair(kFrom, s, p, r); });
      doc["SCP"] = write_record(r);
      return true;
    }
    case StreamKind::TileSetCalibration: {
      tTileSet ts;
      tTileSetCalibration tsc;
      read_with("tile set with calibration", a, [&](ByteArray& s, Long& p) {
        return streams().Stream_TileSetCalibration(kFrom, s, p, ts, tsc);
      });
      doc["TS"] = write_record(ts);
      doc["TSC"] = write_record(tsc);
      return true;
    }
    case StreamKind::ProfileRecord: {
      tOVProfile pro;
      read_with("profile record", a,
                [&](ByteArray& s, Long& p) { return streams().Stream_Profile(kFrom, s, p, pro); });
      doc["pro"] = write_record(pro);
      return true;
    }
    case StreamKind::Station: {
      tStation st;
      read_with("station", a,
                [&](ByteArray& s, Long& p) { return streams().Stream_Station(kFrom, s, p, st); });
      doc["Station"] = write_record(st);
      return true;
    }
    case StreamKind::TestRunRecord: {
      tTestRun1 tr;
      read_with("test run record", a,
                [&](ByteArray& s, Long& p) { return streams().Stream_TestRun(kFrom, s, p, tr); });
      Json record = write_record(tr);
      // The light-level spectra are not part of the stream.
      record["LightLevels"].erase("LightLevels");
      doc["TR"] = std::move(record);
      return true;
    }
    case StreamKind::UserBlock: {
      tUser user;
      read_with("user block", a,
                [&](ByteArray& s, Long& p) { return streams().Stream_User(kFrom, s, p, user); });
      doc["User"] = write_record(user);
      return true;
    }
    case StreamKind::Organization: {
      tOrganization org;
      read_with("organisation", a, [&](ByteArray& s, Long& p) {
        return streams().Stream_Organization(kFrom, s, p, org);
      });
      doc["Org"] = write_record(org);
      return true;
    }
    default:
      return false;
  }
}

bool encode_record_stream(StreamKind kind, const Json& doc, std::vector<Byte>& out) {
  switch (kind) {
    case StreamKind::SCPair: {
      auto r = document_member<tSCPair>(doc, "SCP");
      out = write_with("SC pair", 0, [&](ByteArray& s, Long& p) {
        return streams().Stream_SCPair(kTo, s, p, r);
      });
      return true;
    }
    case StreamKind::TileSetCalibration: {
      Fields f(doc, "");
      f.get("kind");
      tTileSet ts;
      tTileSetCalibration tsc;
      read_record(f.get("TS"), "TS", ts);
      read_record(f.get("TSC"), "TSC", tsc);
      f.done();
      if (ts.TSN != tsc.TSN) {
        bad_input("TSC.TSN: must equal TS.TSN exactly; the stream carries one serial number");
      }
      out = write_with("tile set with calibration", 0, [&](ByteArray& s, Long& p) {
        return streams().Stream_TileSetCalibration(kTo, s, p, ts, tsc);
      });
      return true;
    }
    case StreamKind::ProfileRecord: {
      auto pro = document_member<tOVProfile>(doc, "pro");
      if (pro.ProfileData.is_empty())
        bad_input("pro.ProfileData: the tables are needed to write a profile");
      out = write_with("profile record", 0, [&](ByteArray& s, Long& p) {
        return streams().Stream_Profile(kTo, s, p, pro);
      });
      return true;
    }
    case StreamKind::Station: {
      auto st = document_member<tStation>(doc, "Station");
      out = write_with("station", 0, [&](ByteArray& s, Long& p) {
        return streams().Stream_Station(kTo, s, p, st);
      });
      return true;
    }
    case StreamKind::TestRunRecord: {
      auto tr = document_member<tTestRun1>(doc, "TR");
      out = write_with("test run record", 0, [&](ByteArray& s, Long& p) {
        return streams().Stream_TestRun(kTo, s, p, tr);
      });
      return true;
    }
    case StreamKind::UserBlock: {
      auto user = document_member<tUser>(doc, "User");
      check_width(user.USERID, 8, "User.USERID");
      check_width(user.LastName, 30, "User.LastName");
      check_width(user.FirstName, 30, "User.FirstName");
      check_width(user.UserPWD, 8, "User.UserPWD");
      check_width(user.UserMail, 50, "User.UserMail");
      check_width(user.RoleCode, 1, "User.RoleCode");
      if (!user.RoleCode.empty() && user.RoleCode[0] > 0xFF) {
        bad_input(
            "User.RoleCode: only the low byte of the role travels in a user block, so it "
            "must be a character up to U+00FF");
      }
      out = write_with("user block", kUserBlockBytes, [&](ByteArray& s, Long& p) {
        return streams().Stream_User(kTo, s, p, user);
      });
      return true;
    }
    case StreamKind::Organization: {
      auto org = document_member<tOrganization>(doc, "Org");
      check_width(org.Organization, 50, "Org.Organization");
      check_width(org.Alias, 8, "Org.Alias");
      check_width(org.Avail, 1, "Org.Avail");
      out = write_with("organisation", kOrganizationBlockBytes, [&](ByteArray& s, Long& p) {
        return streams().Stream_Organization(kTo, s, p, org);
      });
      return true;
    }
    default:
      return false;
  }
}

}  // namespace kvdata::cli::codec
