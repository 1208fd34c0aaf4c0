#include "Model/KRDBFilteredVolumesFetchRequest/KRDBFilteredVolumesFetchRequest.hpp"

#include <gtest/gtest.h>

#include "../KRDBFilteredEntitiesFetchRequest/KRFetchRequestCatalog.hpp"

namespace {

TEST(KRDBFilteredVolumesFetchRequestTest, TheRequestIsOverVolumes) {
  const auto request = KRDBFilteredVolumesFetchRequest::init();
  EXPECT_EQ(request->entityType(), 13);
  const auto query = request->selectQuery();
  EXPECT_TRUE(std::dynamic_pointer_cast<dbcore::DBVolumeSelectQuery>(query));
  EXPECT_EQ(query->table(), "volumes");
}

TEST(KRDBFilteredVolumesFetchRequestTest, EveryVolumeNotMarkedToDeleteIsSelected) {
  KRFetchRequestCatalog catalog;
  catalog.create(KRDBEntityTypeVolume, {{}, {}, {}});
  catalog.markFirstToDelete<dbcore::DBVolume>();
  const auto request = KRDBFilteredVolumesFetchRequest::init();
  catalog.expectSelectsEveryRecordNotMarkedToDelete<dbcore::DBVolume>(*request);
}

}  // namespace
