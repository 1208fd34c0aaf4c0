#include "Model/KRDBEntity/KRDBEntityClasses.hpp"

#include <mutex>

#include "Model/KRDBCollection/KRDBCollection.hpp"
#include "Model/KRDBCollectionAttributes/KRDBCollectionAttributes.hpp"
#include "Model/KRDBEntityFavoriteAlias/KRDBEntityFavoriteAlias.hpp"
#include "Model/KRDBImage/KRDBImage.hpp"
#include "Model/KRDBImageAttributes/KRDBImageAttributes.hpp"
#include "Model/KRDBImageExivAttributes/KRDBImageExivAttributes.hpp"
#include "Model/KRDBImageState/KRDBImageState.hpp"
#include "Model/KRDBPath/KRDBPath.hpp"
#include "Model/KRDBRefFolderAttributes/KRDBRefFolderAttributes.hpp"
#include "Model/KRDBReferencedFolder/KRDBReferencedFolder.hpp"
#include "Model/KRDBSmartFilter/KRDBSmartFilter.hpp"
#include "Model/KRDBSmartFilterAttributes/KRDBSmartFilterAttributes.hpp"
#include "Model/KRDBVolume/KRDBVolume.hpp"

void KRDBEntityClasses::registerAll() {
  static std::once_flag once;
  std::call_once(once, [] {
    KRDBImage::registerEntityClass();
    KRDBCollection::registerEntityClass();
    KRDBReferencedFolder::registerEntityClass();
    KRDBPath::registerEntityClass();
    KRDBImageAttributes::registerEntityClass();
    KRDBImageExivAttributes::registerEntityClass();
    KRDBRefFolderAttributes::registerEntityClass();
    KRDBCollectionAttributes::registerEntityClass();
    KRDBEntityFavoriteAlias::registerEntityClass();
    KRDBImageState::registerEntityClass();
    KRDBSmartFilter::registerEntityClass();
    KRDBSmartFilterAttributes::registerEntityClass();
    KRDBVolume::registerEntityClass();
  });
}
