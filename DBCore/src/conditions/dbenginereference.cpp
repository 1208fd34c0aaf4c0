#include "dbenginereference.hpp"

#include <array>
#include <string_view>
#include <utility>

namespace dbcore {

namespace {

constexpr char kSeparator = '\0';
constexpr std::size_t kTagSize = 3;
// NUL, tag, NUL.
constexpr std::size_t kHeaderSize = kTagSize + 2;

constexpr std::array<std::pair<DBEngineReference::Kind, std::string_view>, 4> kTags{{
    {DBEngineReference::Kind::Source, "src"},
    {DBEngineReference::Kind::Other, "oth"},
    {DBEngineReference::Kind::Max, "max"},
    {DBEngineReference::Kind::Min, "min"},
}};

std::string_view tagOf(DBEngineReference::Kind kind) {
  for (const auto& [tagged, tag] : kTags) {
    if (tagged == kind) return tag;
  }
  return {};
}

std::optional<DBEngineReference::Kind> kindOf(std::string_view tag) {
  for (const auto& [kind, tagged] : kTags) {
    if (tagged == tag) return kind;
  }
  return std::nullopt;
}

bool isName(std::string_view name) {
  return !name.empty() && name.find(kSeparator) == std::string_view::npos;
}

}  // namespace

std::string DBEngineReference::text() const {
  std::string text(1, kSeparator);
  text += tagOf(kind);
  text += kSeparator;
  if (kind != Kind::Source) {
    text += table;
    text += kSeparator;
  }
  return text + column;
}

std::optional<DBEngineReference> DBEngineReference::parse(const std::string& text) {
  const std::string_view view(text);
  if (view.size() <= kHeaderSize || view.front() != kSeparator || view[kHeaderSize - 1] != kSeparator) {
    return std::nullopt;
  }
  const std::optional<Kind> kind = kindOf(view.substr(1, kTagSize));
  if (!kind) return std::nullopt;
  const std::string_view names = view.substr(kHeaderSize);
  if (*kind == Kind::Source) {
    if (!isName(names)) return std::nullopt;
    return DBEngineReference{*kind, {}, std::string(names)};
  }
  const std::size_t split = names.find(kSeparator);
  if (split == std::string_view::npos) return std::nullopt;
  const std::string_view table = names.substr(0, split);
  const std::string_view column = names.substr(split + 1);
  if (!isName(table) || !isName(column)) return std::nullopt;
  return DBEngineReference{*kind, std::string(table), std::string(column)};
}

}  // namespace dbcore
