#include "CatalogPopulator.hpp"

#include <map>
#include <utility>

namespace reliability {

namespace {

constexpr int kFolders = 3;
// The images that also get collections, a referenced folder and history states.
constexpr size_t kLinkedImages = 5;

}  // namespace

CatalogPopulator::CatalogPopulator(dbcore::DBReactor& reactor, const std::wstring& label)
    : reactor_(reactor), label_(label) {}

void CatalogPopulator::fill(int imageCount) {
  writeImages(imageCount);
  writeAttributes();
  writeCollections();
  writeReferencedFolder();
  writeHistory();
  reactor_.SetDBApplicationID(4217);
}

void CatalogPopulator::writeImages(int count) {
  auto volume = std::make_shared<dbcore::DBVolume>();
  volume->uuid = label_ + L"-volume";
  volume->info = L"{\"name\": \"" + label_ + L"\"}";
  reactor_ << volume;
  for (int index = 0; index < kFolders; ++index) {
    paths_.push_back(std::make_shared<dbcore::DBPath>());
    paths_.back()->volume_id = volume->id();
    paths_.back()->path = label_ + L"/folder-" + std::to_wstring(index);
  }
  reactor_ << paths_;
  std::vector<std::pair<std::shared_ptr<dbcore::DBPath>, std::shared_ptr<dbcore::DBImage>>> folders;
  for (int index = 0; index < count; ++index) {
    images_.push_back(std::make_shared<dbcore::DBImage>());
    images_.back()->guid = label_ + L"-" + std::to_wstring(index);
    images_.back()->path = L"IMG_" + std::to_wstring(index) + L".jpg";
    images_.back()->width = 6000 + index;
    folders.emplace_back(paths_[static_cast<size_t>(index % kFolders)], images_.back());
  }
  reactor_ << images_;
  reactor_ << folders;
}

void CatalogPopulator::writeAttributes() {
  std::vector<std::shared_ptr<dbcore::DBUserImgAttrib>> user;
  std::vector<std::shared_ptr<dbcore::DBExivImgAttrib>> exif;
  for (const auto& image : images_) {
    user.push_back(std::make_shared<dbcore::DBUserImgAttrib>());
    user.back()->image_id = image->id();
    user.back()->rating = static_cast<int32_t>(image->id() % 6);
    exif.push_back(std::make_shared<dbcore::DBExivImgAttrib>());
    exif.back()->image_id = image->id();
    exif.back()->camera_model = label_ + L" camera";
  }
  reactor_ << user;
  reactor_ << exif;
}

void CatalogPopulator::writeCollections() {
  auto collection = std::make_shared<dbcore::DBFilter>();
  collection->name = label_ + L" trip";
  reactor_ << collection;
  for (size_t index = 0; index < kLinkedImages && index < images_.size(); ++index)
    reactor_.FilterAddImage(collection->id(), images_[index]);
  auto view = std::make_shared<dbcore::DBFilterAttrib>();
  view->filter_id = collection->id();
  reactor_ << std::shared_ptr<dbcore::DBEntity>(view);
  auto smart = std::make_shared<dbcore::DBSmartFilter>();
  smart->name = label_ + L" best";
  smart->filter_conditions = L"{\"imageCondition\": \"width > 100\"}";
  reactor_ << smart;
  auto smartView = std::make_shared<dbcore::DBSmartFilterAttrib>();
  smartView->smart_filter_id = smart->id();
  reactor_ << std::shared_ptr<dbcore::DBEntity>(smartView);
  writeFavorite(collection);
}

void CatalogPopulator::writeReferencedFolder() {
  auto folder = std::make_shared<dbcore::DBRefFolder>();
  folder->uuid = label_ + L"-folder";
  reactor_ << dbcore::DBind<dbcore::DBRefFolder, long long, std::shared_ptr<dbcore::DBPath>>(folder, 1,
                                                                                             paths_.front());
  for (size_t index = 0; index < kLinkedImages && index < images_.size(); ++index)
    reactor_.Bind<dbcore::DBRefFolder, dbcore::DBImage>(folder, images_[index]);
  auto view = std::make_shared<dbcore::DBRefFolderAttrib>();
  view->ref_folder_id = folder->id();
  reactor_ << std::shared_ptr<dbcore::DBEntity>(view);
  writeFavorite(folder);
}

void CatalogPopulator::writeHistory() {
  std::map<std::shared_ptr<dbcore::DBImage>,
           std::pair<std::vector<std::shared_ptr<dbcore::DBImgHistoryState>>, long long>>
      states;
  for (size_t index = 0; index < kLinkedImages && index < images_.size(); ++index) {
    auto& list = states[images_[index]];
    for (int step = 0; step < 3; ++step) {
      list.first.push_back(std::make_shared<dbcore::DBImgHistoryState>());
      list.first.back()->action_name = label_ + L" step " + std::to_wstring(step);
    }
    list.second = 2;
  }
  reactor_.SetStatesByVector<dbcore::DBImage, dbcore::DBImgHistoryState>(states);
  for (const auto& [image, list] : states)
    reactor_.BindStateWithResources(list.first.back(), {label_ + L"-look", label_ + L"-mask"});
}

void CatalogPopulator::writeFavorite(const std::shared_ptr<dbcore::DBEntity>& record) {
  auto favorite = std::make_shared<dbcore::DBEntityFavoriteAlias>();
  favorite->orig_type = record->type();
  favorite->orig_id = record->id();
  favorite->favorite = true;
  reactor_ << favorite;
}

}  // namespace reliability
