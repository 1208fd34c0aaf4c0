#include "CrashOperation.hpp"

#include <array>
#include <sstream>
#include <utility>

namespace reliability {

namespace {

constexpr std::array<std::pair<CrashOperationKind, const char*>, 8> kKindNames{{
    {CrashOperationKind::kOpen, "open"},
    {CrashOperationKind::kWriteImages, "images"},
    {CrashOperationKind::kWriteUserAttributes, "user-attributes"},
    {CrashOperationKind::kWriteExifAttributes, "exif-attributes"},
    {CrashOperationKind::kUpdateImage, "update"},
    {CrashOperationKind::kRemoveImages, "remove"},
    {CrashOperationKind::kReopen, "reopen"},
    {CrashOperationKind::kBackup, "backup"},
}};

const char* nameOf(CrashOperationKind kind) {
  for (const auto& [known, name] : kKindNames)
    if (known == kind) return name;
  return "?";
}

std::optional<CrashOperationKind> kindNamed(const std::string& name) {
  for (const auto& [kind, known] : kKindNames)
    if (name == known) return kind;
  return std::nullopt;
}

}  // namespace

std::string CrashOperation::marker(long long group) { return "g" + std::to_string(group); }

std::optional<long long> CrashOperation::groupOfMarker(const std::string& text) {
  if (text.size() < 2 || text.front() != 'g') return std::nullopt;
  if (text.find_first_not_of("0123456789", 1) != std::string::npos) return std::nullopt;
  return std::stoll(text.substr(1));
}

std::string CrashOperation::backupName() const { return "backup-" + std::to_string(number) + ".krcatalog"; }

std::string CrashOperation::encode() const {
  std::ostringstream text;
  text << number << ' ' << nameOf(kind) << ' ' << group << ' ' << count << ' ' << value;
  return text.str();
}

std::optional<CrashOperation> CrashOperation::decode(const std::string& text) {
  std::istringstream fields(text);
  CrashOperation operation;
  std::string name;
  if (!(fields >> operation.number >> name >> operation.group >> operation.count >> operation.value))
    return std::nullopt;
  const auto kind = kindNamed(name);
  if (!kind) return std::nullopt;
  operation.kind = *kind;
  return operation;
}

}  // namespace reliability
