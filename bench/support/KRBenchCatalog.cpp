#include "KRBenchCatalog.hpp"

#include <filesystem>
#include <map>
#include <memory>
#include <stdexcept>
#include <utility>
#include <vector>

#include "KRBenchRecords.hpp"
#include "Model/KRDBCatalog/KRDBCatalog.hpp"
#include "dbexivimgattrib.hpp"
#include "dbimage.hpp"
#include "dbimghistorystate.hpp"
#include "dbpath.hpp"
#include "dbreactor.hpp"
#include "dbuserimgattrib.hpp"
#include "dbvolume.hpp"

namespace {

using KRBenchRecords::records;

constexpr int kVolumes = 2;

// Two volumes, the folders alternating between them.
std::vector<std::shared_ptr<dbcore::DBPath>> fillFolders(dbcore::DBReactor& reactor, int count) {
  using namespace dbcore;
  const auto volumes = records<DBVolume>(kVolumes, [](DBVolume& volume, int v) {
    volume.uuid = L"VOLUME-" + std::to_wstring(v);
    volume.info = L"{\"name\":\"Disk " + std::to_wstring(v) + L"\"}";
  });
  for (const auto& volume : volumes) reactor << volume;
  const auto folders = records<DBPath>(count, [&volumes](DBPath& folder, int f) {
    folder.path = L"Photos/Folder " + std::to_wstring(f);
    folder.volume_id = volumes[f % kVolumes]->id();
  });
  reactor << folders;
  return folders;
}

std::vector<std::shared_ptr<dbcore::DBImage>> fillImages(dbcore::DBReactor& reactor, int count) {
  using namespace dbcore;
  const auto images = records<DBImage>(count, [](DBImage& image, int i) {
    image.guid = L"GUID-" + std::to_wstring(i);
    image.path = L"IMG_" + std::to_wstring(i) + L".CR3";
    image.width = 6000 + i % 7;
    image.height = 4000 + i % 3;
    image.file_size = 20'000'000 + i;
    image.modification_date = 1'600'000'000 + i;
    image.import_date = 1'650'000'000 + i;
    image.import_index = i;
    image.creation_date = 1'500'000'000 + i;
  });
  reactor << images;
  return images;
}

void fillAttributes(dbcore::DBReactor& reactor, const std::vector<std::shared_ptr<dbcore::DBImage>>& images) {
  using namespace dbcore;
  reactor << records<DBUserImgAttrib>(static_cast<int>(images.size()),
                                      [&images](DBUserImgAttrib& attributes, int i) {
                                        attributes.image_id = images[i]->id();
                                        attributes.rating = i % 6;
                                        attributes.color = i % 4;
                                        attributes.marker = i % 3;
                                        attributes.edit_date = 1'660'000'000 + i;
                                      });
  reactor << records<DBExivImgAttrib>(static_cast<int>(images.size()),
                                      [&images](DBExivImgAttrib& exif, int i) {
                                        exif.image_id = images[i]->id();
                                        exif.iso_speed = static_cast<float>(100 << (i % 6));
                                        exif.shutter_speed = 1.0f / static_cast<float>(1 + i % 500);
                                        exif.f_number = 1.4f + static_cast<float>(i % 10);
                                        exif.focal_length = static_cast<float>(16 + i % 200);
                                        exif.bps = 14;
                                        exif.camera_maker = L"Fujifilm";
                                        exif.camera_model = L"X-T" + std::to_wstring(i % 5);
                                        exif.lens_pretty_name = L"XF" + std::to_wstring(16 + i % 8) + L"mm";
                                        exif.date = 1'500'000'000 + i;
                                        exif.raw = i % 2 == 0;
                                      });
}

// One state per image, its current one, written in one engine call.
void fillStates(dbcore::DBReactor& reactor, const std::vector<std::shared_ptr<dbcore::DBImage>>& images) {
  using namespace dbcore;
  std::map<std::shared_ptr<DBImage>, std::pair<std::vector<std::shared_ptr<DBImgHistoryState>>, long long>>
      states;
  for (size_t i = 0; i < images.size(); ++i) {
    auto state = std::make_shared<DBImgHistoryState>();
    state->action_name = L"Import";
    state->guid = L"STATE-" + std::to_wstring(i);
    state->image_orientation = static_cast<uint64_t>(i % 8);
    state->original = true;
    states.emplace(images[i], std::make_pair(std::vector{std::move(state)}, 0LL));
  }
  reactor.SetStatesByVector<DBImage, DBImgHistoryState>(states);
}

void fill(dbcore::DBReactor& reactor, int imageCount, int folderCount) {
  const auto folders = fillFolders(reactor, folderCount);
  const auto images = fillImages(reactor, imageCount);
  fillAttributes(reactor, images);
  std::vector<std::pair<std::shared_ptr<dbcore::DBPath>, std::shared_ptr<dbcore::DBImage>>> pairs;
  pairs.reserve(images.size());
  for (size_t i = 0; i < images.size(); ++i) pairs.emplace_back(folders[i % folders.size()], images[i]);
  reactor << pairs;
  fillStates(reactor, images);
}

}  // namespace

void KRBenchCatalog::build(const std::string& path, int images, int folders) {
  for (const char* suffix : {"", "-wal", "-shm"}) std::filesystem::remove(path + suffix);
  const auto catalog = KRDBCatalog::initWithContentsOfFile(path, nullptr);
  if (!catalog) throw std::runtime_error("bench catalog not created: " + path);
  catalog->initializeAndUpdateIfNeaded();
  catalog->performSynchronously(true, [&] { fill(*catalog->dbReactor(), images, folders); });
  catalog->forceCloseDB();
}
