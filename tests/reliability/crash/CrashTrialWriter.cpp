#include "CrashTrialWriter.hpp"

#include <stdexcept>
#include <string>

#include "CatalogFormat.hpp"
#include "ChildProcess.hpp"
#include "dbstrings.hpp"

namespace reliability {

namespace {

using Images = std::vector<std::shared_ptr<dbcore::DBImage>>;

std::wstring wideMarker(long long group) { return dbcore::s2ws(CrashOperation::marker(group)); }

std::shared_ptr<dbcore::DBImage> newImage(long long group, int index) {
  auto image = std::make_shared<dbcore::DBImage>();
  image->guid = wideMarker(group);
  image->path = image->guid + L"/" + std::to_wstring(index);
  image->import_index = index;
  image->file_size = 1000 + index;
  return image;
}

// Writes, as one batch, an attribute record of type A for each image, marked by `mark`.
template <class A, class Mark>
void writeAttributes(dbcore::DBReactor& reactor, const Images& images, Mark mark) {
  std::vector<std::shared_ptr<A>> records;
  for (const auto& image : images) {
    auto record = std::make_shared<A>();
    record->image_id = image->id();
    mark(*record);
    records.push_back(record);
  }
  reactor << records;
}

}  // namespace

CrashTrialWriter::CrashTrialWriter(const std::filesystem::path& directory, uint64_t seed)
    : directory_(directory), planner_(seed), log_(directory), reactor_(kAppInfo) {}

int CrashTrialWriter::run(int reportFd) {
  for (;;) {
    const CrashOperation operation = planner_.next();
    log_.begin(operation);
    try {
      perform(operation);
    } catch (const std::exception& error) {
      ChildProcess::report(reportFd, "call " + operation.encode() + " failed: " + error.what());
      return 1;
    }
    log_.acknowledge(operation);
  }
}

void CrashTrialWriter::perform(const CrashOperation& operation) {
  switch (operation.kind) {
    case CrashOperationKind::kOpen:
      return open(dbcore::kDBOpenNeedsUpdate);
    case CrashOperationKind::kWriteImages:
      return writeImages(operation);
    case CrashOperationKind::kWriteUserAttributes:
      return writeUserAttributes(operation);
    case CrashOperationKind::kWriteExifAttributes:
      return writeExifAttributes(operation);
    case CrashOperationKind::kUpdateImage:
      return updateImage(operation);
    case CrashOperationKind::kRemoveImages:
      return removeImages(operation);
    case CrashOperationKind::kReopen:
      reactor_.Close();
      return open(dbcore::kDBOpenCurrent);
    case CrashOperationKind::kBackup:
      return backup(operation);
  }
}

// The first call opens a new file and initializes it; a reopened file is current.
void CrashTrialWriter::open(int expectedAnswer) {
  const int answer = reactor_.Open(dbcore::s2ws((directory_ / kCatalogName).string()), L"");
  if (answer != expectedAnswer) throw std::runtime_error("Open answered " + std::to_string(answer));
  if (answer == dbcore::kDBOpenNeedsUpdate) reactor_.Initialize();
}

void CrashTrialWriter::writeImages(const CrashOperation& operation) {
  Images& images = images_[operation.group];
  for (int index = 0; index < operation.count; ++index) images.push_back(newImage(operation.group, index));
  if (images.size() == 1) {
    reactor_ << images.front();
  } else {
    reactor_ << images;
  }
}

void CrashTrialWriter::writeUserAttributes(const CrashOperation& operation) {
  writeAttributes<dbcore::DBUserImgAttrib>(reactor_, images_.at(operation.group), [&](auto& record) {
    record.origin_name = wideMarker(operation.group);
    record.rating = 1 + static_cast<int32_t>(record.image_id % 5);
  });
}

void CrashTrialWriter::writeExifAttributes(const CrashOperation& operation) {
  writeAttributes<dbcore::DBExivImgAttrib>(reactor_, images_.at(operation.group), [&](auto& record) {
    record.camera_model = wideMarker(operation.group);
    record.iso_speed = 100.0f;
  });
}

void CrashTrialWriter::updateImage(const CrashOperation& operation) {
  const auto& image = images_.at(operation.group).front();
  image->width = static_cast<int32_t>(operation.value);
  reactor_ << image;
}

void CrashTrialWriter::removeImages(const CrashOperation& operation) {
  const Images images = images_.at(operation.group);
  images_.erase(operation.group);
  if (images.size() > 1) {
    reactor_.Remove(images);
  } else if (!reactor_.Remove(images.front())) {
    throw std::runtime_error("Remove answered false");
  }
}

void CrashTrialWriter::backup(const CrashOperation& operation) {
  if (!reactor_.Backup(dbcore::s2ws((directory_ / operation.backupName()).string())))
    throw std::runtime_error("Backup answered false");
}

}  // namespace reliability
