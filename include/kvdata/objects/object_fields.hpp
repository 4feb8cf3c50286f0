#pragma once
// The description of what each streamable object streams: its properties in
// the order a reader shows them, by their interface names, each with the
// type a program exchanges with it and the means to get and set it. A
// property whose type is a record is described further by record_fields.hpp;
// a property that holds other objects (a tolerance set's members) names
// their class.
//
//   kvdata::for_each_property<kvdata::KVTolerance>([&](const auto& p) {
//     std::cout << p.name << '\n';          // ID, TolName, Description, ...
//     auto value = p.get(*tolerance);       // Long, String, Double, ...
//   });

#include <memory>
#include <string_view>
#include <tuple>
#include <vector>

#include "kvdata/foundation/record_fields.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_profile.hpp"
#include "kvdata/objects/kv_test_run.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
#include "kvdata/objects/kv_tol_set.hpp"
#include "kvdata/objects/kv_tolerance.hpp"
#include "kvdata/objects/kv_user.hpp"

namespace kvdata {

// A property of type T on objects of interface Object: get(object) gives
// the value, set(object, value) stores it. `Index` is the enumeration that
// names the indices of a fixed-array value (void: plain numbers).
template <class Object, class T, class Get, class Set, class Index = void>
struct PropertyDescription {
  using object_type = Object;
  using value_type = T;
  using index_type = Index;

  std::string_view name;
  Get get;
  Set set;
};

template <class T, class Index = void, class Object = void, class Get, class Set>
constexpr auto property(std::string_view name, Get get, Set set) {
  return PropertyDescription<Object, T, Get, Set, Index>{name, get, set};
}

// A property that holds objects of class Member: members(object) lists
// them, add(object, member) adds one (raising Error when the object refuses
// it, as a repeated key).
template <class Object, class Member, class List, class Add>
struct MembersDescription {
  using object_type = Object;
  using member_class = Member;

  std::string_view name;
  List members;
  Add add;
};

template <class Member, class Object, class List, class Add>
constexpr auto members(std::string_view name, List list, Add add) {
  return MembersDescription<Object, Member, List, Add>{name, list, add};
}

// Specialised for every streamable class: Interface (what the properties
// take) and kProperties. Objects are made with Class::create().
template <class Class>
struct ObjectDescription;

template <class Class>
concept DescribedObject = requires {
  ObjectDescription<Class>::kProperties;
};

// Calls f(description) for every property of Class, in order.
template <DescribedObject Class, class F>
constexpr void for_each_property(F&& f) {
  std::apply([&](const auto&... p) { (f(p), ...); }, ObjectDescription<Class>::kProperties);
}

namespace detail {

// One of the profile's correction tables as a pair of spectra by eSC.
using ProfileTable = FixedArray<tSpectrum, 0, 1>;
using ProfileGetter = Single (IKVProfile::*)(const eSC&, const Long&) const;
using ProfileSetter = void (IKVProfile::*)(const eSC&, const Long&, const Single&);

constexpr auto profile_table(std::string_view name, ProfileGetter get, ProfileSetter set) {
  return property<ProfileTable, eSC, IKVProfile>(
      name,
      [get](const IKVProfile& p) {
        ProfileTable t;
        for (const eSC sc : {eSC::SCE, eSC::SCI}) {
          for (Long band = 1; band <= kBandCount; ++band) t(sc).Data(band) = (p.*get)(sc, band);
        }
        return t;
      },
      [set](IKVProfile& p, const ProfileTable& t) {
        for (const eSC sc : {eSC::SCE, eSC::SCI}) {
          for (Long band = 1; band <= kBandCount; ++band) (p.*set)(sc, band, t(sc).Data(band));
        }
      });
}

}  // namespace detail

template <>
struct ObjectDescription<KVUser> {
  using Interface = KVUser;
  static constexpr auto kProperties = std::tuple{property<tUser, void, KVUser>(
      "v1User", [](const KVUser& o) { return o.v1User(); },
      [](KVUser& o, const tUser& v) { o.v1User(v); })};
};

template <>
struct ObjectDescription<KVTolerance> {
  using Interface = IKVTolerance;
  static constexpr auto kProperties =
      std::tuple{property<Long, void, IKVTolerance>(
                     "ID", [](const IKVTolerance& o) { return o.ID(); },
                     [](IKVTolerance& o, const Long& v) { o.ID(v); }),
                 property<String, void, IKVTolerance>(
                     "TolName", [](const IKVTolerance& o) { return o.TolName(); },
                     [](IKVTolerance& o, const String& v) { o.TolName(v); }),
                 property<String, void, IKVTolerance>(
                     "Description", [](const IKVTolerance& o) { return o.Description(); },
                     [](IKVTolerance& o, const String& v) { o.Description(v); }),
                 property<Double, void, IKVTolerance>(
                     "MinFail", [](const IKVTolerance& o) { return o.MinFail(); },
                     [](IKVTolerance& o, const Double& v) { o.MinFail(v); }),
                 property<Double, void, IKVTolerance>(
                     "MinWarn", [](const IKVTolerance& o) { return o.MinWarn(); },
                     [](IKVTolerance& o, const Double& v) { o.MinWarn(v); }),
                 property<Double, void, IKVTolerance>(
                     "MaxWarn", [](const IKVTolerance& o) { return o.MaxWarn(); },
                     [](IKVTolerance& o, const Double& v) { o.MaxWarn(v); }),
                 property<Double, void, IKVTolerance>(
                     "MaxFail", [](const IKVTolerance& o) { return o.MaxFail(); },
                     [](IKVTolerance& o, const Double& v) { o.MaxFail(v); }),
                 property<String, void, IKVTolerance>(
                     "Misc", [](const IKVTolerance& o) { return o.Misc(); },
                     [](IKVTolerance& o, const String& v) { o.Misc(v); })};
};

template <>
struct ObjectDescription<KVTolSet> {
  using Interface = KVTolSet;
  static constexpr auto kProperties = std::tuple{
      property<Long, void, KVTolSet>(
          "ID", [](const KVTolSet& o) { return static_cast<const IKVTolSet&>(o).ID(); },
          [](KVTolSet& o, const Long& v) { static_cast<IKVTolSet&>(o).ID(v); }),
      property<Long, void, KVTolSet>(
          "InstTypeID", [](const KVTolSet& o) { return o.InstTypeID(); },
          [](KVTolSet& o, const Long& v) { o.InstTypeID(v); }),
      property<Date, void, KVTolSet>(
          "CreateDate", [](const KVTolSet& o) { return o.CreateDate(); },
          [](KVTolSet& o, const Date& v) { o.CreateDate(v); }),
      // A Variant property that the set keeps as text.
      property<String, void, KVTolSet>(
          "Description",
          [](const KVTolSet& o) {
            return static_cast<const IKVTolSet&>(o).Description().to_string();
          },
          [](KVTolSet& o, const String& v) { static_cast<IKVTolSet&>(o).Description(Variant(v)); }),
      // Members are keyed by their ID, so a repeated ID is refused.
      members<KVTolerance, KVTolSet>(
          "Tolerances",
          [](const KVTolSet& o) {
            return std::vector<std::shared_ptr<IKVTolerance>>(o.begin(), o.end());
          },
          [](KVTolSet& o, const std::shared_ptr<IKVTolerance>& m) {
            o.Add(m, Variant(m->ID()).to_string());
          })};
};

template <>
struct ObjectDescription<KVTile> {
  using Interface = KVTile;
  static constexpr auto kProperties = std::tuple{property<tTileDef, void, KVTile>(
      "v1Tile", [](const KVTile& o) { return o.v1Tile(); },
      [](KVTile& o, const tTileDef& v) { o.v1Tile(v); })};
};

template <>
struct ObjectDescription<KVTileSet> {
  using Interface = KVTileSet;
  static constexpr auto kProperties = std::tuple{property<tTileSet, void, KVTileSet>(
      "v1TileSet", [](const KVTileSet& o) { return o.v1TileSet(); },
      [](KVTileSet& o, const tTileSet& v) { o.v1TileSet(v); })};
};

template <>
struct ObjectDescription<KVCalibration> {
  using Interface = KVCalibration;
  static constexpr auto kProperties = std::tuple{property<tTileSetCalibration, void, KVCalibration>(
      "v1Calibration", [](const KVCalibration& o) { return o.v1Calibration(); },
      [](KVCalibration& o, const tTileSetCalibration& v) { o.v1Calibration(v); })};
};

template <>
struct ObjectDescription<KVProfile> {
  using Interface = IKVProfile;
  static constexpr auto kProperties =
      std::tuple{property<String, void, IKVProfile>(
                     "ISN", [](const IKVProfile& o) { return o.ISN(); },
                     [](IKVProfile& o, const String& v) { o.ISN(v); }),
                 property<Date, void, IKVProfile>(
                     "Created", [](const IKVProfile& o) { return o.Created(); },
                     [](IKVProfile& o, const Date& v) { o.Created(v); }),
                 property<bool, void, IKVProfile>(
                     "Validated", [](const IKVProfile& o) { return o.Validated(); },
                     [](IKVProfile& o, const bool& v) { o.Validated(v); }),
                 property<Long, void, IKVProfile>(
                     "StartWL", [](const IKVProfile& o) { return o.StartWL(); },
                     [](IKVProfile& o, const Long& v) { o.StartWL(v); }),
                 property<Long, void, IKVProfile>(
                     "EndWl", [](const IKVProfile& o) { return o.EndWl(); },
                     [](IKVProfile& o, const Long& v) { o.EndWl(v); }),
                 property<Long, void, IKVProfile>(
                     "Interval", [](const IKVProfile& o) { return o.Interval(); },
                     [](IKVProfile& o, const Long& v) { o.Interval(v); }),
                 detail::profile_table("WhiteCorrection", &IKVProfile::WhiteCorrection,
                                       &IKVProfile::WhiteCorrection),
                 detail::profile_table("WaveCorrection", &IKVProfile::WaveCorrection,
                                       &IKVProfile::WaveCorrection),
                 detail::profile_table("LinearCorrection", &IKVProfile::LinearCorrection,
                                       &IKVProfile::LinearCorrection),
                 detail::profile_table("DarkCorrection", &IKVProfile::DarkCorrection,
                                       &IKVProfile::DarkCorrection),
                 detail::profile_table("BandWidthCorrection", &IKVProfile::BandWidthCorrection,
                                       &IKVProfile::BandWidthCorrection)};
};

template <>
struct ObjectDescription<KVTestRun> {
  using Interface = KVTestRun;
  static constexpr auto kProperties =
      std::tuple{property<Single, void, KVTestRun>(
                     "StreamVersion", [](const KVTestRun& o) { return o.StreamVersion(); },
                     [](KVTestRun& o, const Single& v) { o.StreamVersion(v); }),
                 property<tTestRun1, void, KVTestRun>(
                     "v1TestRun", [](const KVTestRun& o) { return o.v1TestRun(); },
                     [](KVTestRun& o, const tTestRun1& v) { o.v1TestRun(v); }),
                 property<String, void, KVTestRun>(
                     "LightLevelData", [](const KVTestRun& o) { return o.LightLevelData(); },
                     [](KVTestRun& o, const String& v) { o.LightLevelData(v); })};
};

}  // namespace kvdata
