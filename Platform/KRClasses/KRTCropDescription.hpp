#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "KRFoundation/KRGeometry.hpp"
#include "KRFoundation/KRObject.hpp"
#include "KRFoundation/KRValue.hpp"

// The crop of an image: a rectangle in the coordinates of an image of a given size. Immutable.
//
// Every value is finite: a factory given NaN or an infinity, directly or through a conversion,
// answers nil. The dictionary form is
//   {"cropRect": {"x", "y", "width", "height"}, "imageSize": {"width", "height"}}
// of double numbers, and the property-list text is that dictionary as an XML property list whose
// numbers are written in the shortest form that reads back as the same double.
class KRTCropDescription : public KRObject {
 public:
  static std::shared_ptr<KRTCropDescription> initWithCropRect(const KRRect& cropRect,
                                                              const KRSize& imageSize);
  // Nil when a key is missing or does not hold a number (numbers of any kind are read as doubles).
  // Other keys are ignored.
  static std::shared_ptr<KRTCropDescription> initWithDictionary(const KRDictionary& dictionary);
  // Nil for anything but an XML property list of the dictionary form; never raises. The reader knows
  // <dict>, <key>, <real> and <integer>, and allows whitespace, comments and processing instructions
  // between elements.
  static std::shared_ptr<KRTCropDescription> initWithPlistSerialization(const std::string& xml);

  const KRRect& cropRect() const { return cropRect_; }
  const KRSize& imageSize() const { return imageSize_; }

  // The same crop for an image of another size: the crop rectangle's x and width are scaled by
  // newSize.width / imageSize.width, its y and height by newSize.height / imageSize.height. Nil when
  // the image size is zero on an axis (there is no scale to apply) or a result is not finite.
  std::shared_ptr<KRTCropDescription> convertToImageSize(const KRSize& newSize) const;
  KRDictionary cropDescriptionDictionary() const;
  std::string plistSerialization() const;

  // "<KRTCropDescription: cropRect {{x, y}, {width, height}}, imageSize {width, height}>"
  std::string description() const override;
  // Equal when the crop rectangles and the image sizes are equal.
  bool isEqual(const std::shared_ptr<const KRObject>& other) const override;
  uint64_t hash() const override;

 private:
  KRTCropDescription(const KRRect& cropRect, const KRSize& imageSize)
      : cropRect_(cropRect), imageSize_(imageSize) {}

  KRRect cropRect_;
  KRSize imageSize_;
};
