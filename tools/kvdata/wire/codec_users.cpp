// The user, tolerance and tolerance set objects, through their IKVStream.
#include "json/dates.hpp"
#include "json/fields.hpp"
#include "json/numbers.hpp"
#include "json/records.hpp"
#include "kvdata/automation/error.hpp"
#include "kvdata/automation/text.hpp"
#include "kvdata/objects/kv_tol_set.hpp"
#include "kvdata/objects/kv_tolerance.hpp"
#include "kvdata/objects/kv_user.hpp"
#include "support/errors.hpp"
#include "support/library_log.hpp"
#include "wire/codec.hpp"
#include "wire/codec_parts.hpp"

namespace kvdata::cli::codec {
namespace {

Json tolerance_to_json(const IKVTolerance& t) {
  Json j = Json::object();
  j["ID"] = t.ID();
  j["TolName"] = string_to_json(t.TolName());
  j["Description"] = string_to_json(t.Description());
  j["MinFail"] = double_to_json(t.MinFail());
  j["MinWarn"] = double_to_json(t.MinWarn());
  j["MaxWarn"] = double_to_json(t.MaxWarn());
  j["MaxFail"] = double_to_json(t.MaxFail());
  j["Misc"] = string_to_json(t.Misc());
  return j;
}

// A text field of a fixed-width block, checked against its width.
String text_field(Fields& f, const char* name, std::size_t units) {
  String text = read_string(f.get(name), f.at(name));
  check_width(text, units, f.at(name));
  return text;
}

// Fills `t` from the tolerance fields of `f` (under `path`).
void tolerance_from_json(Fields& f, IKVTolerance& t) {
  t.ID(read_long(f.get("ID"), f.at("ID")));
  t.TolName(text_field(f, "TolName", 50));
  t.Description(text_field(f, "Description", 255));
  t.MinFail(double_from_json(f.get("MinFail"), f.at("MinFail")));
  t.MinWarn(double_from_json(f.get("MinWarn"), f.at("MinWarn")));
  t.MaxWarn(double_from_json(f.get("MaxWarn"), f.at("MaxWarn")));
  t.MaxFail(double_from_json(f.get("MaxFail"), f.at("MaxFail")));
  t.Misc(text_field(f, "Misc", 50));
}

}  // namespace

bool decode_user_objects(StreamKind kind, const ByteArray& a, Json& doc) {
  switch (kind) {
    case StreamKind::User: {
      auto user = KVUser::create();
      Long pos = 0;
      LibraryLog log;
      if (!user->StreamIn(a, pos)) {
        bad_input("the library's user reader refused the stream: " + to_utf8(user->ErrMsg()) +
                  log.summary());
      }
      doc["v1User"] = write_record(user->v1User());
      return true;
    }
    case StreamKind::Tolerance: {
      auto tol = KVTolerance::create();
      object_in(*tol, a, "tolerance");
      const Json fields = tolerance_to_json(*tol);
      for (const auto& [key, value] : fields.items()) doc[key] = value;
      return true;
    }
    case StreamKind::TolSet: {
      auto set = KVTolSet::create();
      object_in(*set, a, "tolerance set");
      IKVTolSet& s = *set;
      doc["ID"] = s.ID();
      doc["InstTypeID"] = s.InstTypeID();
      doc["CreateDate"] = date_to_json(s.CreateDate());
      doc["Description"] = string_to_json(s.Description().to_string());
      Json members = Json::array();
      for (const auto& member : *set) members.push_back(tolerance_to_json(*member));
      doc["Tolerances"] = std::move(members);
      return true;
    }
    default:
      return false;
  }
}

bool encode_user_objects(StreamKind kind, const Json& doc, std::vector<Byte>& out) {
  switch (kind) {
    case StreamKind::User: {
      Fields f(doc, "");
      f.get("kind");
      tUser record;
      read_record(f.get("v1User"), "v1User", record);
      f.done();
      check_width(record.USERID, 30, "v1User.USERID");
      check_width(record.LastName, 50, "v1User.LastName");
      check_width(record.FirstName, 50, "v1User.FirstName");
      check_width(record.UserPWD, 30, "v1User.UserPWD");
      check_width(record.UserMail, 255, "v1User.UserMail");
      check_width(record.RoleCode, 1, "v1User.RoleCode");
      check_width(record.Disabled, 1, "v1User.Disabled");
      auto user = KVUser::create();
      user->v1User(record);
      ByteArray a(0, -1);
      Long pos = 0;
      if (!user->StreamOut(a, pos)) {
        bad_input("the library's user writer refused the record: " + to_utf8(user->ErrMsg()));
      }
      out = whole_array(a);
      return true;
    }
    case StreamKind::Tolerance: {
      Fields f(doc, "");
      f.get("kind");
      auto tol = KVTolerance::create();
      tolerance_from_json(f, *tol);
      f.done();
      out = object_out(*tol, "tolerance");
      return true;
    }
    case StreamKind::TolSet: {
      Fields f(doc, "");
      f.get("kind");
      auto set = KVTolSet::create();
      IKVTolSet& s = *set;
      s.ID(read_long(f.get("ID"), f.at("ID")));
      s.InstTypeID(read_long(f.get("InstTypeID"), f.at("InstTypeID")));
      s.CreateDate(date_from_json(f.get("CreateDate"), f.at("CreateDate")));
      s.Description(Variant(text_field(f, "Description", 255)));
      const Json& members = read_array(f.get("Tolerances"), f.at("Tolerances"));
      Long i = 1;
      for (const Json& m : members) {
        const std::string path = element("Tolerances", i++);
        Fields mf(m, path);
        auto tol = KVTolerance::create();
        tolerance_from_json(mf, *tol);
        mf.done();
        const String key = from_utf8(std::to_string(tol->ID()));
        try {
          s.Add(tol, key);
        } catch (const Error&) {
          bad_input(path + ".ID: " + std::to_string(tol->ID()) +
                    " is the ID of an earlier member; a set keys its members by ID");
        }
      }
      f.done();
      out = object_out(*set, "tolerance set");
      return true;
    }
    default:
      return false;
  }
}

}  // namespace kvdata::cli::codec
