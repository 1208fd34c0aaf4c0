#include "CrashOperationPlanner.hpp"

#include <array>

namespace reliability {

namespace {

struct WeightedKind {
  unsigned weight;
  CrashOperationKind kind;
};

constexpr std::array<WeightedKind, 7> kWeights{{
    {30, CrashOperationKind::kWriteImages},
    {15, CrashOperationKind::kWriteUserAttributes},
    {12, CrashOperationKind::kWriteExifAttributes},
    {14, CrashOperationKind::kUpdateImage},
    {12, CrashOperationKind::kRemoveImages},
    {5, CrashOperationKind::kReopen},
    {12, CrashOperationKind::kBackup},
}};

constexpr unsigned totalWeight() {
  unsigned total = 0;
  for (const auto& entry : kWeights) total += entry.weight;
  return total;
}

CrashOperationKind kindForRoll(unsigned roll) {
  for (const auto& entry : kWeights) {
    if (roll < entry.weight) return entry.kind;
    roll -= entry.weight;
  }
  return CrashOperationKind::kWriteImages;
}

// Whether a call of the kind can be made on a group in the given state.
bool suits(CrashOperationKind kind, const GroupState& state) {
  if (state.images == 0) return false;
  if (kind == CrashOperationKind::kWriteUserAttributes) return state.userAttributes == 0;
  if (kind == CrashOperationKind::kWriteExifAttributes) return state.exifAttributes == 0;
  return kind == CrashOperationKind::kUpdateImage || kind == CrashOperationKind::kRemoveImages;
}

bool needsGroup(CrashOperationKind kind) {
  return kind != CrashOperationKind::kWriteImages && kind != CrashOperationKind::kReopen &&
         kind != CrashOperationKind::kBackup;
}

}  // namespace

CrashOperationPlanner::CrashOperationPlanner(uint64_t seed) : random_(seed) {}

CrashOperation CrashOperationPlanner::next() {
  const long long number = ++number_;
  const CrashOperation operation = number == 1 ? CrashOperation{number} : choose(number);
  expectation_.apply(operation);
  return operation;
}

CrashOperation CrashOperationPlanner::choose(long long number) {
  const CrashOperationKind kind = kindForRoll(static_cast<unsigned>(random_() % totalWeight()));
  if (kind == CrashOperationKind::kWriteImages) return imagesCall(number);
  if (needsGroup(kind)) return groupCall(number, kind);
  return CrashOperation{number, kind};
}

// A single image two times in five, otherwise a batch of 2 to 200.
CrashOperation CrashOperationPlanner::imagesCall(long long number) {
  const int count = random_() % 5 < 2 ? 1 : 2 + static_cast<int>(random_() % 199);
  return CrashOperation{number, CrashOperationKind::kWriteImages, number, count};
}

CrashOperation CrashOperationPlanner::groupCall(long long number, CrashOperationKind kind) {
  const std::vector<long long> groups = candidates(kind);
  if (groups.empty()) return imagesCall(number);
  const long long group = groups[random_() % groups.size()];
  return CrashOperation{number, kind, group, expectation_.size(group), number};
}

std::vector<long long> CrashOperationPlanner::candidates(CrashOperationKind kind) const {
  std::vector<long long> groups;
  for (const auto& [id, state] : expectation_.groups())
    if (suits(kind, state)) groups.push_back(id);
  return groups;
}

}  // namespace reliability
