#include "KRClasses/KRTCropDescription.hpp"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <limits>
#include <random>

namespace {

const KRRect kCropRect{{10, 20}, {300, 200}};
const KRSize kImageSize{640, 480};

std::shared_ptr<KRTCropDescription> sampleCrop() {
  return KRTCropDescription::initWithCropRect(kCropRect, kImageSize);
}

// Crops whose values are awkward to write as text.
std::vector<std::shared_ptr<KRTCropDescription>> oddCrops() {
  return {
      KRTCropDescription::initWithCropRect({{0, 0}, {0, 0}}, {0, 0}),
      KRTCropDescription::initWithCropRect({{-12.5, -0.0}, {-3, -1e-300}}, {-640, -480}),
      KRTCropDescription::initWithCropRect({{1e300, -1e300}, {1.7976931348623157e308, 2.5e-308}}, {1e300, 1}),
      KRTCropDescription::initWithCropRect({{5e-324, -5e-324}, {0.1, 1.0 / 3.0}},
                                           {2.0 / 3.0, 0.30000000000000004}),
      KRTCropDescription::initWithCropRect({{123456789.123456789, 0.5}, {1e-7, 9007199254740993.0}},
                                           {4032, 3024}),
  };
}

// Exact comparison of every bit, so that -0 and +0 or nearby doubles cannot pass for each other.
void expectSameBits(const KRTCropDescription& a, const KRTCropDescription& b) {
  const auto bits = [](const KRTCropDescription& crop) {
    return std::vector<uint64_t>{std::bit_cast<uint64_t>(crop.cropRect().origin.x),
                                 std::bit_cast<uint64_t>(crop.cropRect().origin.y),
                                 std::bit_cast<uint64_t>(crop.cropRect().size.width),
                                 std::bit_cast<uint64_t>(crop.cropRect().size.height),
                                 std::bit_cast<uint64_t>(crop.imageSize().width),
                                 std::bit_cast<uint64_t>(crop.imageSize().height)};
  };
  EXPECT_EQ(bits(a), bits(b)) << a.description() << " vs " << b.description();
}

KRDictionary sampleDictionary() {
  return KRDictionary{{"cropRect", KRDictionary{{"x", 1}, {"y", 2}, {"width", 3}, {"height", 4}}},
                      {"imageSize", KRDictionary{{"width", 5}, {"height", 6}}}};
}

// A property list holding the given text where the image size dictionary's height entry goes.
std::string plistWithHeight(const std::string& heightEntry) {
  return "<plist version=\"1.0\"><dict><key>cropRect</key><dict><key>x</key><real>1</real><key>y</key>"
         "<real>2</real><key>width</key><real>3</real><key>height</key><real>4</real></dict>"
         "<key>imageSize</key><dict><key>width</key><real>5</real>" +
         heightEntry + "</dict></dict></plist>";
}

}  // namespace

TEST(KRTCropDescriptionTest, InitWithCropRectKeepsItsValues) {
  const auto crop = sampleCrop();
  ASSERT_TRUE(crop);
  EXPECT_EQ(crop->cropRect(), kCropRect);
  EXPECT_EQ(crop->imageSize(), kImageSize);
  EXPECT_EQ(crop->description(),
            "<KRTCropDescription: cropRect {{10, 20}, {300, 200}}, imageSize {640, 480}>");
}

TEST(KRTCropDescriptionTest, NonFiniteValuesGiveNil) {
  const double nan = std::numeric_limits<double>::quiet_NaN();
  const double infinity = std::numeric_limits<double>::infinity();
  EXPECT_FALSE(KRTCropDescription::initWithCropRect({{nan, 0}, {1, 1}}, {1, 1}));
  EXPECT_FALSE(KRTCropDescription::initWithCropRect({{0, 0}, {1, -infinity}}, {1, 1}));
  EXPECT_FALSE(KRTCropDescription::initWithCropRect({{0, 0}, {1, 1}}, {infinity, 1}));
  const KRDictionary dictionary =
      sampleDictionary().dictionaryBySettingObject(KRDictionary{{"width", 5}, {"height", nan}}, "imageSize");
  EXPECT_FALSE(KRTCropDescription::initWithDictionary(dictionary));
  EXPECT_FALSE(
      KRTCropDescription::initWithPlistSerialization(plistWithHeight("<key>height</key><real>inf</real>")));
}

TEST(KRTCropDescriptionTest, DictionaryHasTheDocumentedKeysOfDoubles) {
  const KRDictionary dictionary = sampleCrop()->cropDescriptionDictionary();
  EXPECT_EQ(dictionary.count(), 2u);
  const KRDictionary rect = dictionary.objectForKey("cropRect").dictionary();
  const KRDictionary size = dictionary.objectForKey("imageSize").dictionary();
  EXPECT_EQ(rect, (KRDictionary{{"x", 10.0}, {"y", 20.0}, {"width", 300.0}, {"height", 200.0}}));
  EXPECT_EQ(size, (KRDictionary{{"width", 640.0}, {"height", 480.0}}));
  EXPECT_EQ(rect.objectForKey("x").number().kind(), KRNumber::Kind::Double);
  EXPECT_EQ(size.objectForKey("height").number().kind(), KRNumber::Kind::Double);
}

TEST(KRTCropDescriptionTest, DictionaryRoundTripsOddValuesExactly) {
  for (const auto& crop : oddCrops()) {
    ASSERT_TRUE(crop);
    const auto copy = KRTCropDescription::initWithDictionary(crop->cropDescriptionDictionary());
    ASSERT_TRUE(copy);
    expectSameBits(*crop, *copy);
  }
}

TEST(KRTCropDescriptionTest, DictionaryAcceptsIntegerNumbersAndIgnoresOtherKeys) {
  const KRDictionary dictionary = sampleDictionary().dictionaryBySettingObject("v2", "version");
  const auto crop = KRTCropDescription::initWithDictionary(dictionary);
  ASSERT_TRUE(crop);
  EXPECT_EQ(crop->cropRect(), (KRRect{{1, 2}, {3, 4}}));
  EXPECT_EQ(crop->imageSize(), (KRSize{5, 6}));
}

TEST(KRTCropDescriptionTest, DictionaryWithMissingOrIllTypedKeysGivesNil) {
  const KRDictionary good = sampleDictionary();
  const KRDictionary rect = good.objectForKey("cropRect").dictionary();
  const std::vector<KRDictionary> bad = {
      KRDictionary(),
      KRDictionary::dictionary(),
      good.dictionaryByRemovingObjectForKey("cropRect"),
      good.dictionaryByRemovingObjectForKey("imageSize"),
      good.dictionaryBySettingObject(rect.dictionaryByRemovingObjectForKey("height"), "cropRect"),
      good.dictionaryBySettingObject(rect.dictionaryBySettingObject("10", "x"), "cropRect"),
      good.dictionaryBySettingObject(rect.dictionaryBySettingObject(KRValue::null(), "y"), "cropRect"),
      good.dictionaryBySettingObject(KRArray{1, 2, 3, 4}, "cropRect"),
      good.dictionaryBySettingObject("640x480", "imageSize"),
      good.dictionaryBySettingObject(KRDictionary{{"width", 5}}, "imageSize"),
  };
  for (size_t i = 0; i < bad.size(); ++i) EXPECT_FALSE(KRTCropDescription::initWithDictionary(bad[i])) << i;
}

TEST(KRTCropDescriptionTest, PlistIsAnAppleStyleXMLPropertyList) {
  const std::string xml = sampleCrop()->plistSerialization();
  EXPECT_EQ(xml.rfind("<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<!DOCTYPE plist PUBLIC", 0), 0u);
  EXPECT_NE(xml.find("<plist version=\"1.0\">\n<dict>\n\t<key>cropRect</key>\n\t<dict>\n"),
            std::string::npos);
  EXPECT_NE(xml.find("\t\t<key>width</key>\n\t\t<real>300</real>\n"), std::string::npos);
  EXPECT_NE(xml.find("<key>imageSize</key>"), std::string::npos);
  EXPECT_EQ(xml.find("<integer>"), std::string::npos);
  EXPECT_TRUE(xml.ends_with("</dict>\n</plist>\n"));
}

TEST(KRTCropDescriptionTest, PlistRoundTripsOddValuesExactly) {
  for (const auto& crop : oddCrops()) {
    const std::string xml = crop->plistSerialization();
    const auto copy = KRTCropDescription::initWithPlistSerialization(xml);
    ASSERT_TRUE(copy) << xml;
    expectSameBits(*crop, *copy);
    EXPECT_EQ(copy->plistSerialization(), xml);
  }
  EXPECT_NE(oddCrops()[3]->plistSerialization().find("<real>5e-324</real>"), std::string::npos);
}

TEST(KRTCropDescriptionTest, PlistReaderAcceptsLayoutVariations) {
  const std::string compact = plistWithHeight("<key>height</key><integer>6</integer>");
  const std::string spacious =
      "\xEF\xBB\xBF<?xml version='1.0'?>\r\n<!-- saved by hand -->\r\n<!DOCTYPE plist>\n"
      "<plist version='1.0' >\n <dict >\n\t<key>imageSize</key>\n <dict><key>height</key><integer> -6 "
      "</integer>"
      "<key>width</key><real>\n5.0\n</real><key>note</key><dict/></dict>\n<!-- rectangle -->\n"
      "<key>crop&amp;size</key><dict/><key>cropRect</key><dict><key>height</key><real>4e0</real>"
      "<key>width</key><integer>3</integer><key>y</key><real>2</real><key>x</key><real>.1E1</real></dict>"
      "</dict>\n</plist >\n\n";
  const auto fromCompact = KRTCropDescription::initWithPlistSerialization(compact);
  const auto fromSpacious = KRTCropDescription::initWithPlistSerialization(spacious);
  ASSERT_TRUE(fromCompact);
  ASSERT_TRUE(fromSpacious);
  EXPECT_EQ(fromCompact->cropRect(), (KRRect{{1, 2}, {3, 4}}));
  EXPECT_EQ(fromCompact->imageSize(), (KRSize{5, 6}));
  EXPECT_EQ(fromSpacious->cropRect(), (KRRect{{1, 2}, {3, 4}}));
  EXPECT_EQ(fromSpacious->imageSize(), (KRSize{5, -6}));
}

TEST(KRTCropDescriptionTest, MalformedPlistGivesNil) {
  const std::vector<std::string> bad = {
      "",
      "   \n",
      "not xml at all",
      "<dict></dict>",
      "<plist version=\"1.0\"></plist>",
      "<plist><array><real>1</real></array></plist>",
      plistWithHeight("<key>height</key><string>6</string>"),
      plistWithHeight("<key>height</key><real>six</real>"),
      plistWithHeight("<key>height</key><real>6px</real>"),
      plistWithHeight("<key>height</key><real></real>"),
      plistWithHeight("<key>height</key><real/>"),
      plistWithHeight("<key>height</key><integer>99999999999999999999</integer>"),
      plistWithHeight("<key>height</key><integer>6.5</integer>"),
      plistWithHeight("<key>height</key><real>1e400</real>"),
      plistWithHeight("<key>height</key><real>6</integer>"),
      plistWithHeight("<key>height</key>"),
      plistWithHeight("<real>6</real>"),
      plistWithHeight("<key>height</key><real>6</real><key>extra</key>"),
      plistWithHeight("<key>hei&ght</key><real>6</real>"),
      plistWithHeight("<key>height</key><real>6</real></key>"),
      plistWithHeight("<key>height</key><real>6<!-- six --></real>"),
      plistWithHeight("<key>height</key><real>6</real>") + "<plist/>",
      plistWithHeight("<key>height</key><real>6</real>") + "trailing",
      "<!-- unterminated" + plistWithHeight("<key>height</key><real>6</real>"),
      "<plist><dict><key>cropRect</key><dict></plist>",
      "<plist><dict><key>cropRect</key><dict><key>x</key><real>1</real></dict></dict></plist>",
      "<plist><dict attr=\"unterminated></dict></plist>",
      "</plist>",
      std::string("<plist>\0</plist>", 16),
  };
  for (size_t i = 0; i < bad.size(); ++i) {
    EXPECT_FALSE(KRTCropDescription::initWithPlistSerialization(bad[i])) << i << ": " << bad[i];
  }
}

TEST(KRTCropDescriptionTest, TruncatedAndMutatedDocumentsNeverCrash) {
  const std::string xml = sampleCrop()->plistSerialization();
  const size_t complete = xml.rfind("</plist>") + std::string("</plist>").size();
  for (size_t length = 0; length < xml.size(); ++length) {
    const bool parses = KRTCropDescription::initWithPlistSerialization(xml.substr(0, length)) != nullptr;
    EXPECT_EQ(parses, length >= complete) << length;
  }
  std::mt19937 random(7);
  int parsed = 0;
  for (int round = 0; round < 2000; ++round) {
    std::string mutated = xml;
    for (int change = 0; change < 3; ++change)
      mutated[random() % mutated.size()] = static_cast<char>(random() % 256);
    if (const auto crop = KRTCropDescription::initWithPlistSerialization(mutated)) {
      ++parsed;
      EXPECT_TRUE(KRTCropDescription::initWithPlistSerialization(crop->plistSerialization())->isEqual(crop));
    }
  }
  EXPECT_LT(parsed, 2000);
}

TEST(KRTCropDescriptionTest, DeeplyNestedDictionariesGiveNil) {
  std::string xml = "<plist>";
  for (int i = 0; i < 100000; ++i) xml += "<dict><key>k</key>";
  EXPECT_FALSE(KRTCropDescription::initWithPlistSerialization(xml));
  for (int i = 0; i < 100000; ++i) xml += "<dict/></dict>";
  EXPECT_FALSE(KRTCropDescription::initWithPlistSerialization(xml + "</plist>"));
}

TEST(KRTCropDescriptionTest, ConvertToImageSizeScalesEachAxis) {
  const auto converted = sampleCrop()->convertToImageSize({1280, 240});
  ASSERT_TRUE(converted);
  EXPECT_EQ(converted->cropRect(), (KRRect{{20, 10}, {600, 100}}));
  EXPECT_EQ(converted->imageSize(), (KRSize{1280, 240}));
  EXPECT_TRUE(sampleCrop()->convertToImageSize(kImageSize)->isEqual(sampleCrop()));
  const auto back = converted->convertToImageSize(kImageSize);
  ASSERT_TRUE(back);
  EXPECT_TRUE(back->isEqual(sampleCrop()));
  const auto toZero = sampleCrop()->convertToImageSize({0, 0});
  ASSERT_TRUE(toZero);
  EXPECT_EQ(toZero->cropRect(), (KRRect{{0, 0}, {0, 0}}));
}

TEST(KRTCropDescriptionTest, ConvertWithoutAScaleOrBeyondDoublesGivesNil) {
  EXPECT_FALSE(KRTCropDescription::initWithCropRect(kCropRect, {0, 480})->convertToImageSize({100, 100}));
  EXPECT_FALSE(KRTCropDescription::initWithCropRect(kCropRect, {640, 0})->convertToImageSize({100, 100}));
  EXPECT_FALSE(
      KRTCropDescription::initWithCropRect({{1e300, 0}, {1, 1}}, {1, 1})->convertToImageSize({1e300, 1}));
  EXPECT_FALSE(sampleCrop()->convertToImageSize({std::nan(""), 1}));
}

TEST(KRTCropDescriptionTest, EqualityAndHashAreByValue) {
  const auto a = sampleCrop();
  const auto b = sampleCrop();
  EXPECT_NE(a, b);
  EXPECT_TRUE(a->isEqual(b));
  EXPECT_EQ(a->hash(), b->hash());
  EXPECT_FALSE(a->isEqual(KRTCropDescription::initWithCropRect({{10, 20}, {300, 201}}, kImageSize)));
  EXPECT_FALSE(a->isEqual(KRTCropDescription::initWithCropRect(kCropRect, {640, 481})));
  EXPECT_FALSE(a->isEqual(nullptr));
  EXPECT_NE(a->hash(), KRTCropDescription::initWithCropRect(kCropRect, {480, 640})->hash());
  const auto zero = KRTCropDescription::initWithCropRect({{0, 0}, {1, 1}}, {1, 1});
  const auto negativeZero = KRTCropDescription::initWithCropRect({{-0.0, 0}, {1, 1}}, {1, 1});
  EXPECT_TRUE(zero->isEqual(negativeZero));
  EXPECT_EQ(zero->hash(), negativeZero->hash());
  EXPECT_EQ(KRValue(a), KRValue(b));
}
