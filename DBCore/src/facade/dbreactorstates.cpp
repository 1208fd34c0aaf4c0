#include "dbreactor.hpp"

#include "dbreactorsupport.hpp"
#include "dbstates.hpp"

// The edit-history states of images.

namespace dbcore {

template <>
std::vector<std::shared_ptr<DBImgHistoryState>> DBReactor::GetStates<DBImage, DBImgHistoryState>(
    std::shared_ptr<DBImage> const& image) {
  return image ? DBStates::states(connection(), image->id())
               : std::vector<std::shared_ptr<DBImgHistoryState>>{};
}

template <>
std::shared_ptr<DBImgHistoryState> DBReactor::GetCurrentState<DBImage, DBImgHistoryState>(
    std::shared_ptr<DBImage> const& image) {
  return image ? DBStates::currentState(connection(), image->id()) : nullptr;
}

template <>
std::map<long long, std::shared_ptr<DBImgHistoryState>>
DBReactor::GetCurrentStates<DBImage, DBImgHistoryState>(
    std::vector<std::shared_ptr<DBImage>> const& images) const {
  if (images.empty()) return DBStates::allCurrentStates(connection());
  std::map<long long, std::shared_ptr<DBImgHistoryState>> current;
  for (const auto& image : images) {
    if (!image) continue;
    if (auto state = DBStates::currentState(connection(), image->id()))
      current.emplace(image->id(), std::move(state));
  }
  return current;
}

template <>
void DBReactor::SetCurrentState<DBImage, DBImgHistoryState>(std::shared_ptr<DBImage> const& image,
                                                            std::shared_ptr<DBImgHistoryState> const& state) {
  DBReactorSupport::requireRecord(image);
  DBConnection& db = connection();
  db.transaction([&] { DBStates::setCurrent(db, image->id(), state); });
}

template <>
void DBReactor::SetStatesByVector<DBImage, DBImgHistoryState>(
    std::map<std::shared_ptr<DBImage>,
             std::pair<std::vector<std::shared_ptr<DBImgHistoryState>>, long long>> const& states) {
  DBConnection& db = connection();
  for (const auto& [image, list] : states) {
    DBReactorSupport::requireRecord(image);
    for (const auto& state : list.first) DBReactorSupport::requireRecord(state);
  }
  db.transaction([&] {
    for (const auto& [image, list] : states) DBStates::replace(db, image->id(), list.first, list.second);
  });
}

void DBReactor::BindStateWithResources(std::shared_ptr<DBImgHistoryState> const& state,
                                       std::vector<std::wstring> const& resources) {
  DBReactorSupport::requireRecord(state);
  DBConnection& db = connection();
  db.transaction([&] { DBStates::bindResources(db, state->id(), resources); });
}

void DBReactor::BindStateWithResourcesFromBaseStateID(std::shared_ptr<DBImgHistoryState> const& state,
                                                      long long baseStateId) {
  DBReactorSupport::requireRecord(state);
  DBConnection& db = connection();
  db.transaction([&] { DBStates::copyResources(db, state->id(), baseStateId); });
}

}  // namespace dbcore
