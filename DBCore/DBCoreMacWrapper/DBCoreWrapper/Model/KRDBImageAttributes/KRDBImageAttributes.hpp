#pragma once

#include <cstdint>
#include <memory>
#include <string>

#include "Model/KRDBEntity/KRDBConcreteEntity.hpp"
#include "Model/KRDBEntity/KRDBTypedRecordEntity.hpp"
#include "dbuserimgattrib.hpp"

extern const char* const kKRDBImageAttributesDidChangeTrashed;
extern const char* const kKRDBImageAttributesDidChangeMarker;
extern const char* const kKRDBImageAttributesDidChangeColor;
extern const char* const kKRDBImageAttributesDidChangeRating;
extern const char* const kKRDBImageAttributesDidChangeEditDate;
extern const char* const kKRDBImageAttributesDidChangeOpened;
extern const char* const kKRDBImageAttributesDidChangeTrashedDate;

class KRDBImage;

// The user's marks of one image (trash, rating, colour label, marker, opened, lost), over a
// dbcore::DBUserImgAttrib record. Its values are cached from the record by its store hook; it points back
// weakly at its image (the image holds it). Used on its context's thread.
class KRDBImageAttributes
    : public KRDBConcreteEntity<KRDBImageAttributes, KRDBTypedRecordEntity<dbcore::DBUserImgAttrib>,
                                KRDBEntityTypeImageAttributes, dbcore::kDBUserImgAttribType> {
 public:
  bool storeInfoFromDBentity(const Record& record) override;
  std::shared_ptr<dbcore::DBUserImgAttrib> dbattrib() const { return typedRecord(); }

  bool isTrashed() const { return trashed_; }
  void setTrashed(bool trashed);
  int32_t marker() const { return marker_; }
  void setMarker(int32_t marker);
  int32_t color() const { return color_; }
  void setColor(int32_t color);
  int32_t rating() const { return rating_; }
  void setRating(int32_t rating);
  const KRDate& editDate() const { return editDate_; }
  void setEditDate(const KRDate& editDate);
  bool isOpened() const { return opened_; }
  void setOpened(bool opened);
  const KRDate& trashedDate() const { return trashedDate_; }
  void setTrashedDate(const KRDate& trashedDate);
  const KRString& originName() const { return originName_; }
  // Only keeps the value: the origin name reaches the record when the record is created.
  void setOriginName(const KRString& originName) { originName_ = originName; }
  bool isLost() const { return lost_; }
  void setLost(bool lost);
  int64_t tutorial() const { return tutorial_; }
  // The record keeps the low 32 bits; the attributes keep the whole value until reloaded.
  void setTutorial(int64_t tutorial);

  // Sets the edit date to now (before every history change of the image).
  void updateModificationDate();

  // The image: the back reference, else asked of the context on first read; nil without a context.
  std::shared_ptr<KRDBImage> image();
  std::shared_ptr<KRDBImage> imagePrimitive() const { return image_.lock(); }
  // Sets the back reference without notification. Held weakly: the image holds its attributes.
  void setImagePrimitive(const std::shared_ptr<KRDBImage>& image) { image_ = image; }

  // The base's, then every user mark back to the engine's default in one change (same id and image id).
  void resetToDefaultState() override;
  // The base's, and the back reference is dropped.
  void reset() override;

  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  friend Concrete;
  using Concrete::Concrete;
  // Takes the values of a record of this class.
  bool storeInfoFromDBAttrib(const std::shared_ptr<dbcore::DBUserImgAttrib>& attributes);

 private:
  static const KRDBKeyAccessors<KRDBImageAttributes>& keyAccessors();

  bool trashed_ = false;
  int32_t marker_ = 0;
  int32_t color_ = 0;
  int32_t rating_ = 0;
  KRDate editDate_;
  bool opened_ = false;
  KRDate trashedDate_;
  KRString originName_;
  bool lost_ = false;
  int64_t tutorial_ = 0;
  std::weak_ptr<KRDBImage> image_;
};
