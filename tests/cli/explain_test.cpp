// The library's readers seen through an observer: every example stream is
// tiled exactly by the fields its reader reports and is identified without
// KIND; the library's writers show the texts they would cut.
#include <gtest/gtest.h>

#include <string>

#include "command_runner.hpp"
#include "kvdata/objects/kv_calibration.hpp"
#include "kvdata/objects/kv_tile.hpp"
#include "kvdata/objects/kv_tile_set.hpp"
#include "kvdata/objects/kv_tolerance.hpp"
#include "kvdata/objects/kv_user.hpp"
#include "kvdata/streams/streams.hpp"
#include "support/errors.hpp"
#include "support/files.hpp"
#include "wire/identify.hpp"
#include "wire/stream_walk.hpp"
#include "wire/width_check.hpp"

namespace kvdata::cli {
namespace {

// Checks that each field starts where the one before it ended.
class Tiling : public WalkSink {
 public:
  void field(std::string_view path, const StreamField& f) override {
    EXPECT_EQ(static_cast<std::size_t>(f.position), end) << path;
    EXPECT_GT(f.width, 0) << path;
    EXPECT_FALSE(path.empty());
    end += static_cast<std::size_t>(f.width);
    ++fields;
  }
  std::size_t end = 0;
  std::size_t fields = 0;
};

TEST(Explain, EveryExampleIsTiledByTheFieldsItsReaderTakesAndIdentifiedWithoutKind) {
  for (const KindInfo& k : all_kinds()) {
    SCOPED_TRACE(std::string(k.name));
    const ByteArray bytes =
        read_byte_array(test::example("streams/" + std::string(k.name) + ".kvs"));
    Tiling tiling;
    const WalkEnd end = walk_stream(k.kind, bytes, tiling);
    EXPECT_FALSE(end.problem) << end.problem->field << ": " << end.problem->expected;
    EXPECT_EQ(tiling.end, bytes.size());
    EXPECT_EQ(end.end, bytes.size());
    EXPECT_GE(tiling.fields, 3u);
    EXPECT_EQ(verdict(k.kind, end, bytes.size()), "The whole stream reads as " +
                                                      std::string(k.name) + " (" +
                                                      std::to_string(bytes.size()) + " bytes).");

    const Identification id = identify(bytes);
    ASSERT_TRUE(id.kind) << id.reason;
    EXPECT_EQ(*id.kind, k.kind) << id.reason;
  }
}

// Runs `write` with a width check installed; the message it raised, or "".
template <class Write>
std::string refusal(const Write& write) {
  WidthCheck check;
  const ObservedStreams watch(check);
  try {
    write();
    check.verify();
  } catch (const InputError& e) {
    return e.what();
  }
  return "";
}

TEST(WidthCheck, ATextLongerThanItsFieldIsRefusedWithItsPath) {
  const String fits30(30, u'x');
  const String long31(31, u'x');
  ByteArray out(0, -1);
  Long pos = 0;

  auto user = KVUser::create();
  tUser record;
  record.USERID = fits30;
  user->v1User(record);
  EXPECT_EQ(refusal([&] { ASSERT_TRUE(user->StreamOut(out, pos)); }), "");
  record.USERID = long31;
  user->v1User(record);
  EXPECT_EQ(refusal([&] { static_cast<void>(user->StreamOut(out, pos)); }),
            "v1User.USERID: 31 characters, but the field holds 30; the library would cut the "
            "text");

  record = tUser{};
  record.UserMail = String(51, u'm');
  ByteArray block(0, 260);
  pos = 0;
  EXPECT_EQ(refusal([&] {
              static_cast<void>(
                  Streams::instance().Stream_User(eStreamDirection::ToStream, block, pos, record));
            }).substr(0, 50),
            "User.UserMail: 51 characters, but the field holds ");

  tOrganization org;
  org.Alias = u"ABCDEFGHI";
  ByteArray org_block(0, 132);
  pos = 0;
  EXPECT_NE(refusal([&] {
              static_cast<void>(Streams::instance().StreamOrgTo(org, org_block, pos));
            }).find("Org.Alias: 9 characters, but the field holds 8"),
            std::string::npos);

  auto set = KVTileSet::create();
  tTileSet tiles = set->v1TileSet();
  tiles.Tiles(2).Name = String(51, u'n');
  set->v1TileSet(tiles);
  pos = 0;
  EXPECT_NE(refusal([&] {
              static_cast<void>(set->StreamOut(out, pos));
            }).find("v1TileSet.Tiles(2).Name: 51 characters, but the field holds 50"),
            std::string::npos);

  // Properties that keep their record as an image cut the text when it is set.
  EXPECT_NE(
      refusal([&] { KVTile::create()->v1Tile(tiles.Tiles(2)); }).find("v1Tile.Name: 51 characters"),
      std::string::npos);
  tTileSetCalibration calibration;
  calibration.TSN = u"CT-4471-B";
  calibration.Tiles.redim(1, 13);
  EXPECT_NE(refusal([&] {
              KVCalibration::create()->v1Calibration(calibration);
            }).find("v1Calibration.TSN: 9 characters, but the field holds 8"),
            std::string::npos);
  EXPECT_NE(refusal([&] {
              KVTolerance::create()->TolName(String(51, u't'));
            }).find("TolName: 51 characters, but the field holds 50"),
            std::string::npos);
  EXPECT_EQ(refusal([&] { KVTolerance::create()->TolName(String(50, u't')); }), "");
}

}  // namespace
}  // namespace kvdata::cli
