#include "CatalogExpectation.hpp"

namespace reliability {

void CatalogExpectation::apply(const CrashOperation& operation) {
  switch (operation.kind) {
    case CrashOperationKind::kWriteImages:
      sizes_[operation.group] = operation.count;
      groups_[operation.group] = GroupState{operation.count, 0, 0, 0};
      break;
    case CrashOperationKind::kWriteUserAttributes:
      groups_[operation.group].userAttributes = operation.count;
      break;
    case CrashOperationKind::kWriteExifAttributes:
      groups_[operation.group].exifAttributes = operation.count;
      break;
    case CrashOperationKind::kUpdateImage:
      groups_[operation.group].width = operation.value;
      break;
    case CrashOperationKind::kRemoveImages:
      groups_[operation.group] = GroupState{};
      break;
    case CrashOperationKind::kOpen:
    case CrashOperationKind::kReopen:
    case CrashOperationKind::kBackup:
      break;
  }
}

GroupState CatalogExpectation::group(long long id) const {
  const auto found = groups_.find(id);
  return found == groups_.end() ? GroupState{} : found->second;
}

int CatalogExpectation::size(long long id) const {
  const auto found = sizes_.find(id);
  return found == sizes_.end() ? 0 : found->second;
}

}  // namespace reliability
