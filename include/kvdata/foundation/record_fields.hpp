#pragma once
// The description of the shared records, written once for every program that
// shows, converts or binds them: each record's fields in declaration order,
// by the names the records spell, with their types (the member's own type),
// the enumeration that indexes a fixed array (SCE/SCI), and the record a
// Variant field holds. The enumerations that records carry are described
// with their member names.
//
//   kvdata::for_each_field(station, [](const auto& field, auto& value) {
//     std::cout << field.name << '\n';          // StationGUID, StationName, StationMail
//   });
//   static_assert(kvdata::field_name<&kvdata::tUser::UserMail>() == "UserMail");
//
// Conventions a reader of the description can rely on: a record whose only
// field is a fixed array (tSpectrum, tSCPair) stands for that array; fixed
// arrays without an index enumeration are indexed by number from their lower
// bound; dynamic arrays (Array<T>) carry their own bounds.

#include <array>
#include <optional>
#include <string_view>
#include <tuple>
#include <type_traits>
#include <utility>

#include "kvdata/foundation/enums.hpp"
#include "kvdata/foundation/records.hpp"

namespace kvdata {

// One field: its name and member. `Index` is the enumeration whose members
// name the indices of a fixed array (void: plain numbers); `Holds` is the
// record a Variant field holds (void for other fields). `streamed` is false
// for a field that no byte stream carries, so that a program showing a
// stream leaves it out and one reading such a program's output accepts it
// missing (the field then keeps its initial value).
template <class Record, class Member, class Index = void, class Holds = void>
struct FieldDescription {
  using record_type = Record;
  using member_type = Member;
  using index_type = Index;
  using holds_type = Holds;

  std::string_view name;
  Member Record::*member;
  bool streamed = true;

  constexpr Member& of(Record& r) const { return r.*member; }
  constexpr const Member& of(const Record& r) const { return r.*member; }
};

// A field; a fixed array indexed by an enumeration names it first:
// field<eSC>("Spectrum", &tSCPair::Spectrum).
template <class Index = void, class Record, class Member>
constexpr FieldDescription<Record, Member, Index> field(std::string_view name,
                                                        Member Record::*member) {
  return {name, member};
}

// A field that no stream carries: unstreamed_field("LightLevels", ...).
template <class Index = void, class Record, class Member>
constexpr FieldDescription<Record, Member, Index> unstreamed_field(std::string_view name,
                                                                   Member Record::*member) {
  return {name, member, false};
}

// A Variant field that holds the record `Holds` when it is not Empty.
template <class Holds, class Record>
constexpr FieldDescription<Record, Variant, void, Holds> variant_field(std::string_view name,
                                                                       Variant Record::*member) {
  return {name, member};
}

// Specialised for every shared record: kName and kFields (a tuple of
// FieldDescription in declaration order).
template <class R>
struct RecordDescription;

template <class R>
concept DescribedRecord = requires {
  RecordDescription<std::remove_cv_t<R>>::kFields;
};

template <class E>
struct EnumDescription;

template <class E>
concept DescribedEnum = requires {
  EnumDescription<E>::kMembers;
};

// --- Records ------------------------------------------------------------------

template <>
struct RecordDescription<tSpectrum> {
  static constexpr std::string_view kName = "tSpectrum";
  static constexpr auto kFields = std::tuple{field("Data", &tSpectrum::Data)};
};

template <>
struct RecordDescription<tSCPair> {
  static constexpr std::string_view kName = "tSCPair";
  static constexpr auto kFields = std::tuple{field<eSC>("Spectrum", &tSCPair::Spectrum)};
};

template <>
struct RecordDescription<tTileDef> {
  static constexpr std::string_view kName = "tTileDef";
  static constexpr auto kFields =
      std::tuple{field("Name", &tTileDef::Name), field("ColorRGB", &tTileDef::ColorRGB),
                 field("TempComp", &tTileDef::TempComp)};
};

template <>
struct RecordDescription<tTileSet> {
  static constexpr std::string_view kName = "tTileSet";
  static constexpr auto kFields =
      std::tuple{field("TSN", &tTileSet::TSN), field("Tiles", &tTileSet::Tiles)};
};

template <>
struct RecordDescription<tTileSetCalibration> {
  static constexpr std::string_view kName = "tTileSetCalibration";
  static constexpr auto kFields = std::tuple{
      field("TSN", &tTileSetCalibration::TSN), field("Certified", &tTileSetCalibration::Certified),
      field("TempCalibrated", &tTileSetCalibration::TempCalibrated),
      field("Tiles", &tTileSetCalibration::Tiles)};
};

template <>
struct RecordDescription<tTSListInfo> {
  static constexpr std::string_view kName = "tTSListInfo";
  static constexpr auto kFields =
      std::tuple{field("TSN", &tTSListInfo::TSN), field("Certified", &tTSListInfo::Certified)};
};

template <>
struct RecordDescription<tOrganization> {
  static constexpr std::string_view kName = "tOrganization";
  static constexpr auto kFields = std::tuple{field("ID", &tOrganization::ID),
                                             field("Organization", &tOrganization::Organization),
                                             field("ParentOrgID", &tOrganization::ParentOrgID),
                                             field("RootOrgID", &tOrganization::RootOrgID),
                                             field("Alias", &tOrganization::Alias),
                                             field("Avail", &tOrganization::Avail)};
};

template <>
struct RecordDescription<tStation> {
  static constexpr std::string_view kName = "tStation";
  static constexpr auto kFields = std::tuple{field("StationGUID", &tStation::StationGUID),
                                             field("StationName", &tStation::StationName),
                                             field("StationMail", &tStation::StationMail)};
};

template <>
struct RecordDescription<tUser> {
  static constexpr std::string_view kName = "tUser";
  static constexpr auto kFields =
      std::tuple{field("USERID", &tUser::USERID),     field("UserNumber", &tUser::UserNumber),
                 field("LastName", &tUser::LastName), field("FirstName", &tUser::FirstName),
                 field("UserPWD", &tUser::UserPWD),   field("UserMail", &tUser::UserMail),
                 field("OrgID", &tUser::OrgID),       field("RoleCode", &tUser::RoleCode),
                 field("Disabled", &tUser::Disabled)};
};

template <>
struct RecordDescription<tTestStats> {
  static constexpr std::string_view kName = "tTestStats";
  static constexpr auto kFields = std::tuple{
      field("TestResult", &tTestStats::TestResult), field("TestExplain", &tTestStats::TestExplain),
      field("TestStart", &tTestStats::TestStart), field("TestEnd", &tTestStats::TestEnd)};
};

template <>
struct RecordDescription<tTUD_LightLevels> {
  static constexpr std::string_view kName = "tTUD_LightLevels";
  static constexpr auto kFields =
      std::tuple{field("Stats", &tTUD_LightLevels::Stats),
                 unstreamed_field("LightLevels", &tTUD_LightLevels::LightLevels)};
};

template <>
struct RecordDescription<tTUD_Repeatability> {
  static constexpr std::string_view kName = "tTUD_Repeatability";
  static constexpr auto kFields =
      std::tuple{field("Stats", &tTUD_Repeatability::Stats),
                 field("BlueTileStdDev", &tTUD_Repeatability::BlueTileStdDev),
                 field("BlueTileMaxdE", &tTUD_Repeatability::BlueTileMaxdE),
                 field("BlueTileRMSdE", &tTUD_Repeatability::BlueTileRMSdE),
                 field("BlueTileDriftdE", &tTUD_Repeatability::BlueTileDriftdE),
                 field("WhiteTileStdDev", &tTUD_Repeatability::WhiteTileStdDev),
                 field("WhiteTileMaxdE", &tTUD_Repeatability::WhiteTileMaxdE),
                 field("WhiteTileRMSdE", &tTUD_Repeatability::WhiteTileRMSdE),
                 field("WhiteTileDriftdE", &tTUD_Repeatability::WhiteTileDriftdE)};
};

template <>
struct RecordDescription<tIIATile> {
  static constexpr std::string_view kName = "tIIATile";
  static constexpr auto kFields = std::tuple{field("Trial", &tIIATile::Trial),
                                             field("TrialProfiled", &tIIATile::TrialProfiled)};
};

template <>
struct RecordDescription<tIIATileSet> {
  static constexpr std::string_view kName = "tIIATileSet";
  static constexpr auto kFields =
      std::tuple{field("Tiles", &tIIATileSet::Tiles), field("Profile", &tIIATileSet::Profile)};
};

template <>
struct RecordDescription<tTUD_IIA> {
  static constexpr std::string_view kName = "tTUD_IIA";
  static constexpr auto kFields = std::tuple{
      field("Stats", &tTUD_IIA::Stats), field("TSN", &tTUD_IIA::TSN),
      field("CalStandard", &tTUD_IIA::CalStandard), field("Measurements", &tTUD_IIA::Measurements),
      field("Has2Measurement", &tTUD_IIA::Has2Measurement)};
};

template <>
struct RecordDescription<tTestRun1> {
  static constexpr std::string_view kName = "tTestRun1";
  static constexpr auto kFields =
      std::tuple{field("ISN", &tTestRun1::ISN),
                 field("UserNumber", &tTestRun1::UserNumber),
                 field("StationGUID", &tTestRun1::StationGUID),
                 field("TestDate", &tTestRun1::TestDate),
                 field("Comment", &tTestRun1::Comment),
                 field("Stats", &tTestRun1::Stats),
                 field("CommunicationsTest", &tTestRun1::CommunicationsTest),
                 field("LightLevels", &tTestRun1::LightLevels),
                 field("Repeatability", &tTestRun1::Repeatability),
                 field("IIA", &tTestRun1::IIA)};
};

template <>
struct RecordDescription<tDeltas> {
  static constexpr std::string_view kName = "tDeltas";
  static constexpr auto kFields =
      std::tuple{field<eSC>("dL", &tDeltas::dL), field<eSC>("dA", &tDeltas::dA),
                 field<eSC>("dB", &tDeltas::dB), field<eSC>("dE", &tDeltas::dE)};
};

template <>
struct RecordDescription<tTileDeltas> {
  static constexpr std::string_view kName = "tTileDeltas";
  static constexpr auto kFields = std::tuple{field("Deltas", &tTileDeltas::Deltas),
                                             field<eSC>("avgDeltaE", &tTileDeltas::avgDeltaE)};
};

template <>
struct RecordDescription<tOVProfileDataV1> {
  static constexpr std::string_view kName = "tOVProfileDataV1";
  static constexpr auto kFields = std::tuple{
      field<eSC>("wCal", &tOVProfileDataV1::wCal), field<eSC>("wave", &tOVProfileDataV1::wave),
      field<eSC>("Linear", &tOVProfileDataV1::Linear), field<eSC>("Dark", &tOVProfileDataV1::Dark)};
};

template <>
struct RecordDescription<tOVProfile> {
  static constexpr std::string_view kName = "tOVProfile";
  static constexpr auto kFields =
      std::tuple{field("ISN", &tOVProfile::ISN), field("Created", &tOVProfile::Created),
                 field("Validated", &tOVProfile::Validated),
                 variant_field<tOVProfileDataV1>("ProfileData", &tOVProfile::ProfileData)};
};

template <>
struct RecordDescription<tOVProfilePatch> {
  static constexpr std::string_view kName = "tOVProfilePatch";
  static constexpr auto kFields =
      std::tuple{field("ISN", &tOVProfilePatch::ISN), field("Created", &tOVProfilePatch::Created),
                 field("Validated", &tOVProfilePatch::Validated),
                 field("ProfileData", &tOVProfilePatch::ProfileData)};
};

namespace detail {

// Counts the fields of an aggregate: the most initialisers it takes.
struct AnyInitialiser {
  template <class T>
  operator T() const;  // never called: only the count is asked for
};
template <class T, class... Given>
consteval std::size_t aggregate_fields() {
  if constexpr (requires { T{Given{}..., AnyInitialiser{}}; }) {
    return aggregate_fields<T, Given..., AnyInitialiser>();
  } else {
    return sizeof...(Given);
  }
}

// True when the description lists as many fields as the record has.
template <class R>
consteval bool describes_every_field() {
  return std::tuple_size_v<std::remove_const_t<decltype(RecordDescription<R>::kFields)>> ==
         aggregate_fields<R>();
}

static_assert(describes_every_field<tSpectrum>() && describes_every_field<tSCPair>() &&
                  describes_every_field<tTileDef>() && describes_every_field<tTileSet>() &&
                  describes_every_field<tTileSetCalibration>() &&
                  describes_every_field<tTSListInfo>() && describes_every_field<tOrganization>() &&
                  describes_every_field<tStation>() && describes_every_field<tUser>() &&
                  describes_every_field<tTestStats>() &&
                  describes_every_field<tTUD_LightLevels>() &&
                  describes_every_field<tTUD_Repeatability>() &&
                  describes_every_field<tIIATile>() && describes_every_field<tIIATileSet>() &&
                  describes_every_field<tTUD_IIA>() && describes_every_field<tTestRun1>() &&
                  describes_every_field<tDeltas>() && describes_every_field<tTileDeltas>() &&
                  describes_every_field<tOVProfileDataV1>() &&
                  describes_every_field<tOVProfile>() && describes_every_field<tOVProfilePatch>(),
              "a record has a field its description does not list");

constexpr bool same_text(std::string_view a, std::u16string_view b) {
  if (a.size() != b.size()) return false;
  for (std::size_t i = 0; i < a.size(); ++i) {
    if (static_cast<char16_t>(a[i]) != b[i]) return false;
  }
  return true;
}
}  // namespace detail
static_assert(detail::same_text(RecordDescription<tOVProfileDataV1>::kName,
                                RecordTraits<tOVProfileDataV1>::kTypeName));

// --- Enumerations ----------------------------------------------------------------

template <class E>
struct EnumMember {
  std::string_view name;
  E value;
};

template <>
struct EnumDescription<eSC> {
  static constexpr std::array kMembers{EnumMember<eSC>{"SCE", eSC::SCE},
                                       EnumMember<eSC>{"SCI", eSC::SCI}};
};

template <>
struct EnumDescription<eTestResult> {
  static constexpr std::array kMembers{EnumMember<eTestResult>{"Certified", eTestResult::Certified},
                                       EnumMember<eTestResult>{"Pass", eTestResult::Pass},
                                       EnumMember<eTestResult>{"Fail", eTestResult::Fail},
                                       EnumMember<eTestResult>{"NA", eTestResult::NA}};
};

// --- Walking the description ------------------------------------------------------

// Calls f(description, member) for every field of `record`, in declaration
// order; `member` is const when `record` is.
template <class R, class F>
requires DescribedRecord<R>
constexpr void for_each_field(R& record, F&& f) {
  std::apply([&](const auto&... d) { (f(d, d.of(record)), ...); },
             RecordDescription<std::remove_cv_t<R>>::kFields);
}

// Calls f(description) for every field of the record type R, in order.
template <class R, class F>
requires DescribedRecord<R>
constexpr void for_each_field_of(F&& f) {
  std::apply([&](const auto&... d) { (f(d), ...); }, RecordDescription<R>::kFields);
}

namespace detail {
template <class R, class M>
consteval std::string_view find_field_name(M R::*member) {
  std::string_view found;
  for_each_field_of<R>([&](const auto& d) {
    if constexpr (std::is_same_v<typename std::remove_cvref_t<decltype(d)>::member_type, M>) {
      if (d.member == member) found = d.name;
    }
  });
  return found;
}
}  // namespace detail

// The name of the field `Member` points to: field_name<&tUser::UserMail>() == "UserMail".
template <auto Member>
consteval std::string_view field_name() {
  constexpr std::string_view name = detail::find_field_name(Member);
  static_assert(!name.empty(), "not a described field");
  return name;
}

// The member name of an enumeration value; nothing for a value outside it.
template <DescribedEnum E>
constexpr std::optional<std::string_view> member_name(E value) {
  for (const auto& m : EnumDescription<E>::kMembers) {
    if (m.value == value) return m.name;
  }
  return std::nullopt;
}

// The value of a member name; nothing for a name the enumeration lacks.
template <DescribedEnum E>
constexpr std::optional<E> member_value(std::string_view name) {
  for (const auto& m : EnumDescription<E>::kMembers) {
    if (m.name == name) return m.value;
  }
  return std::nullopt;
}

}  // namespace kvdata
