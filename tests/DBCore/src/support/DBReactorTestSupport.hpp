#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "dbreactor.hpp"
#include "dbstrings.hpp"
#include "support/KRTemporaryDirectory.hpp"

// A test with an initialized catalog file in a temporary folder.
class DBReactorTestBase : public testing::Test {
 protected:
  static constexpr dbcore::AppInfo kAppInfo = 5;

  void SetUp() override {
    reactor = std::make_unique<dbcore::DBReactor>(kAppInfo);
    ASSERT_EQ(reactor->Open(dbcore::s2ws(catalogPath()), L""), dbcore::kDBOpenNeedsUpdate);
    reactor->Initialize();
  }

  std::string catalogPath() const { return directory.file("catalog.krcatalog"); }

  std::shared_ptr<dbcore::DBImage> makeImage(const std::wstring& name) {
    auto image = std::make_shared<dbcore::DBImage>();
    image->path = name;
    image->guid = L"guid-" + name;
    *reactor << image;
    return image;
  }

  std::shared_ptr<dbcore::DBPath> makePath(const std::wstring& path, long long volumeId = 0) {
    auto record = std::make_shared<dbcore::DBPath>();
    record->path = path;
    record->volume_id = volumeId;
    *reactor << std::vector<std::shared_ptr<dbcore::DBPath>>{record};
    return record;
  }

  std::shared_ptr<dbcore::DBFilter> makeFilter(const std::wstring& name, float order = 0) {
    auto filter = std::make_shared<dbcore::DBFilter>();
    filter->name = name;
    filter->order = order;
    *reactor << filter;
    return filter;
  }

  KRTemporaryDirectory directory;
  std::unique_ptr<dbcore::DBReactor> reactor;
};
