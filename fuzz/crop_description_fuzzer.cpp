// Feeds arbitrary bytes to the crop-description property-list reader, whose input comes from catalog
// files. The reader answers nil for anything it does not accept and never raises, so any exception
// aborts. A crop it accepts must hold finite values only, and its property list and dictionary forms
// must read back as an equal crop.
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <initializer_list>
#include <memory>
#include <string>

#include "KRClasses/KRTCropDescription.hpp"

namespace {

using CropPtr = std::shared_ptr<KRTCropDescription>;

[[noreturn]] void fail(const char* what, const CropPtr& crop) {
  std::fprintf(stderr, "%s: %s\n", what, crop->description().c_str());
  std::abort();
}

bool isFinite(const KRTCropDescription& crop) {
  const KRRect& rect = crop.cropRect();
  const KRSize& size = crop.imageSize();
  for (double value :
       {rect.origin.x, rect.origin.y, rect.size.width, rect.size.height, size.width, size.height}) {
    if (!std::isfinite(value)) return false;
  }
  return true;
}

void checkReadsBack(const CropPtr& crop) {
  const CropPtr fromPlist = KRTCropDescription::initWithPlistSerialization(crop->plistSerialization());
  if (!fromPlist || !fromPlist->isEqual(crop)) fail("the property list does not read back", crop);
  const CropPtr fromDictionary = KRTCropDescription::initWithDictionary(crop->cropDescriptionDictionary());
  if (!fromDictionary || !fromDictionary->isEqual(crop)) fail("the dictionary does not read back", crop);
  if (fromPlist->hash() != crop->hash()) fail("equal crops hash differently", crop);
}

void checkConversion(const CropPtr& crop) {
  const CropPtr converted = crop->convertToImageSize(KRSize{6000, 4000});
  if (converted && !isFinite(*converted)) fail("a converted crop is not finite", crop);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
  const std::string xml(reinterpret_cast<const char*>(data), size);
  const CropPtr crop = KRTCropDescription::initWithPlistSerialization(xml);
  if (!crop) return 0;
  if (!isFinite(*crop)) fail("an accepted crop is not finite", crop);
  checkReadsBack(crop);
  checkConversion(crop);
  return 0;
}
