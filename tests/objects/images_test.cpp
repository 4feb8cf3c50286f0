// Every [section] of tests/data/object-images.txt against the bytes its
// builder below writes from Position 0 (without an object's spare byte).
// Array sizing: stream_out_test.cpp; reading back: tests/data/cut-streams.txt.

#include <gtest/gtest.h>

#include <functional>
#include <memory>

#include "kvdata/kvdata.hpp"
#include "objects/expected_bytes.hpp"
#include "support/streams.hpp"

namespace kvdata {
namespace {

using testing::Bytes;
using testing::encoding;

// A record block written into an array of exactly its size.
template <class R>
Bytes block(bool (Streams::*fn)(const eStreamDirection&, ByteArray&, Long&, R&), R r, Long room) {
  ByteArray s(0, room - 1);
  Long p = 0;
  EXPECT_TRUE((Streams::instance().*fn)(eStreamDirection::ToStream, s, p, r));
  EXPECT_EQ(p, room);
  return testing::contents(s);
}

std::shared_ptr<KVTolerance> tolerance(Long id, const String& name) {
  auto tol = KVTolerance::create();
  tol->ID(id);
  tol->TolName(name);
  return tol;
}

const struct {
  const char* section;
  std::function<Bytes()> write;
} kImages[] = {
    {"tolerance",
     [] {
       auto tol = tolerance(5, u"dE");
       tol->Description(u"Max");
       tol->Misc(u"");
       tol->MinFail(-1.5);
       tol->MinWarn(0.5);
       tol->MaxWarn(1.0);
       tol->MaxFail(2.0);
       return encoding(*tol);
     }},
    {"new tolerance", [] { return encoding(*KVTolerance::create()); }},
    {"user",
     [] {
       auto user = KVUser::create();
       user->v1User(
           tUser{u"ABCD", 0x01020304, String(60, u'L'), u"Ann  ", u"pw", u"a@b.c", -2, u"", u""});
       return encoding(*user);
     }},
    {"tolerance set",
     [] {
       auto set = KVTolSet::create();
       set->ID(7);
       set->InstTypeID(3);
       set->CreateDate(Date{2.0});
       set->Description(Variant(u"Set"));
       set->Add(tolerance(5, u"A"), u"5");
       set->Add(tolerance(9, u"B"), u"9");
       return encoding(*set);
     }},
    {"new profile", [] { return encoding(*KVProfile::create()); }},
    {"tile",
     [] {
       auto tile = KVTile::create();
       tile->ColorName(u"  Red");
       tile->ColorRGB(0x00112233);
       tile->TempCompWL(1, 1.0);
       tile->TempCompWL(40, -2.5);
       return encoding(*tile);
     }},
    {"calibration",
     [] {
       auto cal = KVCalibration::create();
       cal->TSN(u"AB");
       cal->DateCertified(Date{45000.5});
       cal->TempCalibrated(23.5f);
       cal->Tiles(1)->SCWL(eSC::SCE, 1, 1.0);
       cal->Tiles(13)->SCWL(eSC::SCI, 40, 87.5);
       cal->Tiles(2)->SCWL(eSC::SCI, 1, -2.5);
       return encoding(*cal);
     }},
    // Texts longer than their field are cut, shorter ones padded; Disabled
    // is not in the block.
    {"user block",
     [] {
       return block(&Streams::Stream_User,
                    tUser{u"ABCDEFGHIJ", 0x01020304, u"Smith", u"Bartholomew-Maximilian-Johannes",
                          u"pw", u"a@b.c", -2, u"AB", u"Y"},
                    261);
     }},
    {"organization block",
     [] {
       return block(
           &Streams::Stream_Organization,
           tOrganization{7, u"Kelvanto Calibration Laboratories of the Northern Region, Ltd", 1, -1,
                         u"KL", u"Y"},
           133);
     }},
};

TEST(ObjectImages, EachSectionIsWhatItsBuilderWrites) {
  for (const auto& image : kImages) {
    SCOPED_TRACE(image.section);
    EXPECT_EQ(image.write(), ImageFromData(image.section));
  }
}

}  // namespace
}  // namespace kvdata
