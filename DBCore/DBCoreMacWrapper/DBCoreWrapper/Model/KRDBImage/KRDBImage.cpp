#include "Model/KRDBImage/KRDBImage.hpp"

bool KRDBImage::storeInfoFromDBentity(const Record& record) {
  return storeInfoWithHook(record, &KRDBImage::storeInfoFromDBImage);
}

bool KRDBImage::storeInfoFromDBImage(const std::shared_ptr<dbcore::DBImage>& /*image*/) { return true; }
