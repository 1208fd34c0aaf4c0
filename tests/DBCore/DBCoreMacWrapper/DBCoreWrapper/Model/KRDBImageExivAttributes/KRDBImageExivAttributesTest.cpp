#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"

#include <gtest/gtest.h>

#include <limits>
#include <string>
#include <vector>

#include "KREntityClassChecks.hpp"
#include "KREntityObserverRecorder.hpp"
#include "KRRecordFieldRows.hpp"
#include "dbuserimgattrib.hpp"

namespace {

using dbcore::DBExivImgAttrib;
using Checks = KREntityClassChecks<KRDBImageExivAttributes, dbcore::DBExivImgAttrib, dbcore::DBUserImgAttrib>;
using Exif = KRDBImageExivAttributes;
using Row = KRRecordProperty<Exif>;

TEST(KRDBImageExivAttributesTest, TypeNumbers) {
  EXPECT_EQ(KRDBImageExivAttributes::entityType(), 6);
  EXPECT_EQ(KRDBImageExivAttributes::dbEntityType(), 5);
}

TEST(KRDBImageExivAttributesTest, RegisteredUnderItsRecordType) { Checks::expectRegistered(); }

TEST(KRDBImageExivAttributesTest, BuiltOverItsOwnRecord) { Checks::expectBuiltOverOwnRecord(); }

TEST(KRDBImageExivAttributesTest, MarkedToDeleteComesFromTheRecord) {
  Checks::expectMarkedToDeleteTakenFromRecord();
}

TEST(KRDBImageExivAttributesTest, NoRecordOrAForeignRecordIsRefused) {
  Checks::expectForeignRecordsRefused();
}

// A record whose float fields hold 1.5, 2.5, ... in table order.
std::shared_ptr<DBExivImgAttrib> exivRecord() {
  auto record = std::make_shared<DBExivImgAttrib>();
  record->set_id(12);
  record->image_id = 77;
  float next = 1.5f;
  for (float DBExivImgAttrib::*field :
       {&DBExivImgAttrib::iso_speed, &DBExivImgAttrib::shutter_speed, &DBExivImgAttrib::f_number,
        &DBExivImgAttrib::focal_length, &DBExivImgAttrib::focal_length35, &DBExivImgAttrib::ev,
        &DBExivImgAttrib::min_focal_length, &DBExivImgAttrib::max_focal_length, &DBExivImgAttrib::min_shutter,
        &DBExivImgAttrib::max_shutter, &DBExivImgAttrib::aperture, &DBExivImgAttrib::focus_distance}) {
    (*record).*field = next;
    next += 1.0f;
  }
  record->bps = 14;
  record->white_balance = -3;
  record->white_balance_index = 4;
  record->light_source = 5;
  record->metering_mode = 6;
  record->camera_maker = L"Canon";
  record->camera_name = L"Canon EOS R5";
  record->camera_model = L"EOS R5";
  record->lens_maker = L"Sigma";
  record->lens_pretty_name = L"35mm \u0192/1.4";
  record->date = 1600000000;
  record->raw = true;
  record->full_filled = true;
  record->version = 3;
  return record;
}

std::shared_ptr<Exif> makeExif() { return Exif::initWithDBEntity(exivRecord()); }

TEST(KRDBImageExivAttributesTest, TheRecordGivesEveryFieldAndTheImageIdentifier) {
  const auto record = exivRecord();
  const auto exif = Exif::initWithDBEntity(record);
  EXPECT_EQ(exif->dbexivattrib(), record);
  EXPECT_TRUE(exif->imageID()->isEqual(KRDBEntityID::initWithEntityType(1, 77)));
  const std::vector<float> floats{exif->isoSpeed(),       exif->shutterSpeed(),   exif->fNumber(),
                                  exif->focalLength(),    exif->focalLength35(),  exif->ev(),
                                  exif->minFocalLength(), exif->maxFocalLength(), exif->minShutter(),
                                  exif->maxShutter(),     exif->aperture(),       exif->focusDistance()};
  EXPECT_EQ(floats,
            (std::vector<float>{1.5f, 2.5f, 3.5f, 4.5f, 5.5f, 6.5f, 7.5f, 8.5f, 9.5f, 10.5f, 11.5f, 12.5f}));
  EXPECT_EQ(exif->bps(), 14.0f);
  EXPECT_EQ(exif->whiteBalance(), -3);
  EXPECT_EQ(exif->whiteBalanceIndex(), 4);
  EXPECT_EQ(exif->lightSource(), 5);
  EXPECT_EQ(exif->meteringMode(), 6);
  EXPECT_EQ(exif->cameraMaker(), KRString("Canon"));
  EXPECT_EQ(exif->cameraName(), KRString("Canon EOS R5"));
  EXPECT_EQ(exif->cameraModel(), KRString("EOS R5"));
  EXPECT_EQ(exif->lensMaker(), KRString("Sigma"));
  EXPECT_EQ(exif->lensPrettyName(), KRString("35mm \u0192/1.4"));
  EXPECT_EQ(exif->date().timeIntervalSince1970(), 1600000000.0);
  EXPECT_TRUE(exif->isRaw());
  EXPECT_TRUE(exif->isFullFilled());
  EXPECT_EQ(exif->version(), 3);
}

TEST(KRDBImageExivAttributesTest, ARecordOfAnotherClassGivesNoTypedRecord) {
  const auto exif = Exif::initWithDBEntity(std::make_shared<dbcore::DBUserImgAttrib>());
  ASSERT_TRUE(exif);
  EXPECT_EQ(exif->dbexivattrib(), nullptr);
  EXPECT_EQ(exif->imageID(), nullptr);
}

TEST(KRDBImageExivAttributesTest, TheExportedChangeKeysHoldTheirOwnNames) {
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeIsoSpeed, "kKRDBImageExivAttributesDidChangeIsoSpeed");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeShutterSpeed,
               "kKRDBImageExivAttributesDidChangeShutterSpeed");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeFNumber, "kKRDBImageExivAttributesDidChangeFNumber");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeFocalLength, "kKRDBImageExivAttributesDidChangeFocalLength");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeFocalLength35,
               "kKRDBImageExivAttributesDidChangeFocalLength35");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeEv, "kKRDBImageExivAttributesDidChangeEv");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeMinFocalLength,
               "kKRDBImageExivAttributesDidChangeMinFocalLength");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeMaxFocalLength,
               "kKRDBImageExivAttributesDidChangeMaxFocalLength");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeMinShutter, "kKRDBImageExivAttributesDidChangeMinShutter");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeMaxShutter, "kKRDBImageExivAttributesDidChangeMaxShutter");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeAperture, "kKRDBImageExivAttributesDidChangeAperture");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeFocusDistance,
               "kKRDBImageExivAttributesDidChangeFocusDistance");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeBps, "kKRDBImageExivAttributesDidChangeBps");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeWhiteBalance,
               "kKRDBImageExivAttributesDidChangeWhiteBalance");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeWhiteBalanceIndex,
               "kKRDBImageExivAttributesDidChangeWhiteBalanceIndex");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeLightSource, "kKRDBImageExivAttributesDidChangeLightSource");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeMeteringMode,
               "kKRDBImageExivAttributesDidChangeMeteringMode");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeCameraMaker, "kKRDBImageExivAttributesDidChangeCameraMaker");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeCameraName, "kKRDBImageExivAttributesDidChangeCameraName");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeCameraModel, "kKRDBImageExivAttributesDidChangeCameraModel");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeLensMaker, "kKRDBImageExivAttributesDidChangeLensMaker");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeLensPrettyName,
               "kKRDBImageExivAttributesDidChangeLensPrettyName");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeDate, "kKRDBImageExivAttributesDidChangeDate");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeRaw, "kKRDBImageExivAttributesDidChangeRaw");
  EXPECT_STREQ(kKRDBImageExivAttributesDidChangeFullFilled, "kKRDBImageExivAttributesDidChangeFullFilled");
}

// Every record-backed property with its exact change key (the version's is posted but not exported) and its
// record conversion: bps truncated toward zero, the white balance's low 32 bits, wide strings, whole seconds.
TEST(KRDBImageExivAttributesTest, EveryRecordFieldFollowsTheSetterProtocol) {
  using R = DBExivImgAttrib;
  const std::vector<Row> rows{
      recordFieldRow("isoSpeed", "kKRDBImageExivAttributesDidChangeIsoSpeed", &Exif::setIsoSpeed,
                     &Exif::isoSpeed, 100.25f, &R::iso_speed, 100.25f),
      recordFieldRow("shutterSpeed", "kKRDBImageExivAttributesDidChangeShutterSpeed", &Exif::setShutterSpeed,
                     &Exif::shutterSpeed, 101.25f, &R::shutter_speed, 101.25f),
      recordFieldRow("fNumber", "kKRDBImageExivAttributesDidChangeFNumber", &Exif::setFNumber, &Exif::fNumber,
                     102.25f, &R::f_number, 102.25f),
      recordFieldRow("focalLength", "kKRDBImageExivAttributesDidChangeFocalLength", &Exif::setFocalLength,
                     &Exif::focalLength, 103.25f, &R::focal_length, 103.25f),
      recordFieldRow("focalLength35", "kKRDBImageExivAttributesDidChangeFocalLength35",
                     &Exif::setFocalLength35, &Exif::focalLength35, 104.25f, &R::focal_length35, 104.25f),
      recordFieldRow("ev", "kKRDBImageExivAttributesDidChangeEv", &Exif::setEv, &Exif::ev, 105.25f, &R::ev,
                     105.25f),
      recordFieldRow("minFocalLength", "kKRDBImageExivAttributesDidChangeMinFocalLength",
                     &Exif::setMinFocalLength, &Exif::minFocalLength, 106.25f, &R::min_focal_length, 106.25f),
      recordFieldRow("maxFocalLength", "kKRDBImageExivAttributesDidChangeMaxFocalLength",
                     &Exif::setMaxFocalLength, &Exif::maxFocalLength, 107.25f, &R::max_focal_length, 107.25f),
      recordFieldRow("minShutter", "kKRDBImageExivAttributesDidChangeMinShutter", &Exif::setMinShutter,
                     &Exif::minShutter, 108.25f, &R::min_shutter, 108.25f),
      recordFieldRow("maxShutter", "kKRDBImageExivAttributesDidChangeMaxShutter", &Exif::setMaxShutter,
                     &Exif::maxShutter, 109.25f, &R::max_shutter, 109.25f),
      recordFieldRow("aperture", "kKRDBImageExivAttributesDidChangeAperture", &Exif::setAperture,
                     &Exif::aperture, 110.25f, &R::aperture, 110.25f),
      recordFieldRow("focusDistance", "kKRDBImageExivAttributesDidChangeFocusDistance",
                     &Exif::setFocusDistance, &Exif::focusDistance, 111.25f, &R::focus_distance, 111.25f),
      recordFieldRow("bps", "kKRDBImageExivAttributesDidChangeBps", &Exif::setBps, &Exif::bps, -9.75f,
                     &R::bps, -9),
      recordFieldRow("whiteBalance", "kKRDBImageExivAttributesDidChangeWhiteBalance", &Exif::setWhiteBalance,
                     &Exif::whiteBalance, int64_t{-4294967296 + 8}, &R::white_balance, 8),
      recordFieldRow("whiteBalanceIndex", "kKRDBImageExivAttributesDidChangeWhiteBalanceIndex",
                     &Exif::setWhiteBalanceIndex, &Exif::whiteBalanceIndex, 40, &R::white_balance_index, 40),
      recordFieldRow("lightSource", "kKRDBImageExivAttributesDidChangeLightSource", &Exif::setLightSource,
                     &Exif::lightSource, 41, &R::light_source, 41),
      recordFieldRow("meteringMode", "kKRDBImageExivAttributesDidChangeMeteringMode", &Exif::setMeteringMode,
                     &Exif::meteringMode, 42, &R::metering_mode, 42),
      recordFieldRow("version", "kKRDBImageExivAttributesDidChangeVersion", &Exif::setVersion, &Exif::version,
                     43, &R::version, 43),
      recordFieldRow("cameraMaker", "kKRDBImageExivAttributesDidChangeCameraMaker", &Exif::setCameraMaker,
                     &Exif::cameraMaker, KRString("cameraMaker \u00e9"), &R::camera_maker,
                     std::wstring(L"cameraMaker \u00e9")),
      recordFieldRow("cameraName", "kKRDBImageExivAttributesDidChangeCameraName", &Exif::setCameraName,
                     &Exif::cameraName, KRString("cameraName \u00e9"), &R::camera_name,
                     std::wstring(L"cameraName \u00e9")),
      recordFieldRow("cameraModel", "kKRDBImageExivAttributesDidChangeCameraModel", &Exif::setCameraModel,
                     &Exif::cameraModel, KRString("cameraModel \u00e9"), &R::camera_model,
                     std::wstring(L"cameraModel \u00e9")),
      recordFieldRow("lensMaker", "kKRDBImageExivAttributesDidChangeLensMaker", &Exif::setLensMaker,
                     &Exif::lensMaker, KRString("lensMaker \u00e9"), &R::lens_maker,
                     std::wstring(L"lensMaker \u00e9")),
      recordFieldRow("lensPrettyName", "kKRDBImageExivAttributesDidChangeLensPrettyName",
                     &Exif::setLensPrettyName, &Exif::lensPrettyName, KRString("lensPrettyName \u00e9"),
                     &R::lens_pretty_name, std::wstring(L"lensPrettyName \u00e9")),
      recordFieldRow("date", "kKRDBImageExivAttributesDidChangeDate", &Exif::setDate, &Exif::date,
                     KRDate::dateWithTimeIntervalSince1970(-99.5), &R::date, int64_t{-99}),
      recordFieldRow("raw", "kKRDBImageExivAttributesDidChangeRaw", &Exif::setRaw, &Exif::isRaw, false,
                     &R::raw, false),
      recordFieldRow("fullFilled", "kKRDBImageExivAttributesDidChangeFullFilled", &Exif::setFullFilled,
                     &Exif::isFullFilled, false, &R::full_filled, false),
  };
  EXPECT_EQ(rows.size(), 26u);
  expectSetterProtocol<Exif>(makeExif, rows);
}

TEST(KRDBImageExivAttributesTest, BpsIsTruncatedInTheRecordAndKeptWholeUntilReloaded) {
  const auto record = exivRecord();
  const auto exif = Exif::initWithDBEntity(record);
  exif->setBps(7.9f);
  EXPECT_EQ(record->bps, 7);
  EXPECT_EQ(exif->bps(), 7.9f);
  EXPECT_EQ(Exif::initWithDBEntity(record)->bps(), 7.0f);
  exif->setBps(-7.9f);
  EXPECT_EQ(record->bps, -7);
}

TEST(KRDBImageExivAttributesTest, BpsOutsideTheRecordsRangeIsSaturatedAndNaNIsZero) {
  const auto record = exivRecord();
  const auto exif = Exif::initWithDBEntity(record);
  exif->setBps(1e12f);
  EXPECT_EQ(record->bps, 2147483647);
  exif->setBps(-1e12f);
  EXPECT_EQ(record->bps, -2147483647 - 1);
  exif->setBps(std::numeric_limits<float>::quiet_NaN());
  EXPECT_EQ(record->bps, 0);
}

TEST(KRDBImageExivAttributesTest, TheWhiteBalanceKeepsItsLow32BitsInTheRecord) {
  const auto record = exivRecord();
  const auto exif = Exif::initWithDBEntity(record);
  exif->setWhiteBalance(4294967297);
  EXPECT_EQ(record->white_balance, 1);
  EXPECT_EQ(exif->whiteBalance(), 4294967297);
}

TEST(KRDBImageExivAttributesTest, AnEqualButDistinctStringCountsAsAChange) {
  const auto exif = makeExif();
  const auto observer = KREntityObserverRecorder::observing(*exif);
  const KRString equal("Canon");
  ASSERT_EQ(equal, exif->cameraMaker());
  exif->setCameraMaker(equal);
  ASSERT_EQ(observer->kinds(), (std::vector<std::string>{"willChange", "didChange"}));
  EXPECT_EQ(observer->events[1].info, KRDictionary({{"kKRDBImageExivAttributesDidChangeCameraMaker", true}}));
}

TEST(KRDBImageExivAttributesTest, AnEqualFloatPostsNothing) {
  const auto exif = makeExif();
  const auto observer = KREntityObserverRecorder::observing(*exif);
  exif->setIsoSpeed(1.5f);
  EXPECT_TRUE(observer->events.empty());
  EXPECT_FALSE(exif->isDbEntityChanged());
}

TEST(KRDBImageExivAttributesTest, TheImageIsAskedOfTheContextOnFirstRead) {
  expectLazyImage(makeExif(), "imageForExivAttributes");
}

TEST(KRDBImageExivAttributesTest, TheImageBackReferenceIsWeakAndSilent) {
  expectWeakImagePrimitive(makeExif());
}

TEST(KRDBImageExivAttributesTest, FieldsAreReachedByKey) {
  const auto exif = makeExif();
  EXPECT_EQ(exif->valueForKey("isoSpeed"), KRValue(1.5));
  EXPECT_EQ(exif->valueForKey("cameraModel"), KRValue("EOS R5"));
  EXPECT_EQ(exif->valueForKey("raw"), KRValue(true));
  EXPECT_EQ(exif->valueForKey("imageID").object(), exif->imageID());
  EXPECT_EQ(exif->valueForKeyPath("date.timeIntervalSince1970"), KRValue(1600000000.0));
  exif->setValueForKey(3.5, "bps");
  exif->setValueForKey(int64_t{4294967297}, "whiteBalance");
  exif->setValueForKey("Nikon", "lensMaker");
  EXPECT_EQ(exif->bps(), 3.5f);
  EXPECT_EQ(exif->dbexivattrib()->bps, 3);
  EXPECT_EQ(exif->whiteBalance(), 4294967297);
  EXPECT_EQ(exif->dbexivattrib()->lens_maker, L"Nikon");
}

}  // namespace
