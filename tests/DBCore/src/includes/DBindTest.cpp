#include "dbind.hpp"

#include <gtest/gtest.h>

#include <memory>
#include <tuple>

#include "dbimage.hpp"
#include "dbpath.hpp"
#include "dbreffolder.hpp"

using namespace dbcore;

TEST(DBindTest, HoldsTheRecordAndItsBoundValuesInOrder) {
  auto folder = std::make_shared<DBRefFolder>();
  auto path = std::make_shared<DBPath>();
  const DBind<DBRefFolder, long long, std::shared_ptr<DBPath>> binding(folder, 7, path);
  EXPECT_EQ(binding.record, folder);
  EXPECT_EQ(std::get<0>(binding.bound), 7);
  EXPECT_EQ(std::get<1>(binding.bound), path);
  EXPECT_EQ(path.use_count(), 2);
}

TEST(DBindTest, RecordAloneHasNoBoundValues) {
  auto image = std::make_shared<DBImage>();
  const DBind<DBImage> binding(image);
  EXPECT_EQ(binding.record, image);
  EXPECT_EQ(std::tuple_size_v<decltype(binding.bound)>, 0u);
}
