#pragma once

#include <memory>

#include "Model/KRDBEntitiesFilter/KRDBRequestedEntitiesFilter.hpp"

// A live filter over an image fetch request, where a change of an image's user or exif attributes counts
// as a change of the image. Used on the context's thread.
class KRDBImagesFilter : public KRDBRequestedEntitiesFilter {
 public:
  static std::shared_ptr<KRDBImagesFilter> initWithContext(const std::shared_ptr<KRDBContext>& context,
                                                           RequestPtr request);

  // Adds the images of updated attribute records to the updated entities, with the records' changes.
  void processChanges(const ChangesStoragePtr& changes) override;

 private:
  KRDBImagesFilter() = default;
};
