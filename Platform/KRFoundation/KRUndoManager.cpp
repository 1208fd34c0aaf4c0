#include "KRFoundation/KRUndoManager.hpp"

#include <algorithm>
#include <utility>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRRunLoop.hpp"

namespace {

bool sameOwner(const std::weak_ptr<const void>& registered, const std::shared_ptr<const void>& target) {
  return !registered.owner_before(target) && !target.owner_before(registered);
}

[[noreturn]] void raiseInconsistency(const char* reason) {
  KRException::raise(KRException::NSInternalInconsistencyException, reason);
}

}  // namespace

// A group of undo actions; an entry is either an action or a closed nested group.
struct KRUndoManager::Group {
  struct Entry {
    std::weak_ptr<const void> target;
    std::function<void()> invoke;
    std::unique_ptr<Group> nested;
  };

  std::vector<Entry> entries;
  KRString actionName{""};
  // Non-zero for a group opened automatically by groups-by-event.
  uint64_t automaticSerial = 0;
  // Set when its turn ended while a group inside it was open: it closes on the turn after that one closes.
  bool closingDue = false;

  // Runs the actions in reverse registration order, nested groups included.
  void perform() const {
    for (auto entry = entries.rbegin(); entry != entries.rend(); ++entry) {
      if (entry->nested) {
        entry->nested->perform();
      } else {
        entry->invoke();
      }
    }
  }

  // Drops the actions of the target, and nested groups that this leaves empty.
  void removeTarget(const std::shared_ptr<const void>& target) {
    for (Entry& entry : entries) {
      if (entry.nested) entry.nested->removeTarget(target);
    }
    std::erase_if(entries, [&](const Entry& entry) {
      return entry.nested ? entry.nested->entries.empty() : sameOwner(entry.target, target);
    });
  }
};

// Marks the manager as undoing or redoing and collects the registrations of the replay in a top-level
// group, closed (onto the opposite stack) when the replay ends, also by an exception.
class KRUndoManager::ReplayScope {
 public:
  ReplayScope(KRUndoManager& manager, Replay replay, const KRString& actionName) : manager_(manager) {
    manager_.replay_ = replay;
    manager_.beginUndoGrouping();
    manager_.openGroups_.back()->actionName = actionName;
  }
  ~ReplayScope() {
    while (!manager_.openGroups_.empty()) manager_.closeInnermostGroup();
    manager_.replay_ = Replay::None;
  }
  ReplayScope(const ReplayScope&) = delete;
  ReplayScope& operator=(const ReplayScope&) = delete;

 private:
  KRUndoManager& manager_;
};

KRUndoManager::KRUndoManager() = default;
KRUndoManager::~KRUndoManager() = default;

std::shared_ptr<KRUndoManager> KRUndoManager::undoManager() {
  return std::shared_ptr<KRUndoManager>(new KRUndoManager);
}

void KRUndoManager::beginUndoGrouping() { openGroups_.push_back(std::make_unique<Group>()); }

void KRUndoManager::endUndoGrouping() {
  if (openGroups_.empty()) raiseInconsistency("endUndoGrouping called with no open undo group");
  closeInnermostGroup();
}

void KRUndoManager::kr_endUndoGrouping() {
  if (!openGroups_.empty()) closeInnermostGroup();
}

int KRUndoManager::groupingLevel() const { return static_cast<int>(openGroups_.size()); }

bool KRUndoManager::groupsByEvent() const { return groupsByEvent_; }

void KRUndoManager::setGroupsByEvent(bool groupsByEvent) { groupsByEvent_ = groupsByEvent; }

void KRUndoManager::undo() {
  closeOpenAutomaticGroup();
  undoNestedGroup();
}

void KRUndoManager::redo() {
  closeOpenAutomaticGroup();
  replayNewest(redoStack_, Replay::Redoing);
}

void KRUndoManager::undoNestedGroup() { replayNewest(undoStack_, Replay::Undoing); }

bool KRUndoManager::canUndo() const { return undoCandidate() != nullptr; }

bool KRUndoManager::canRedo() const { return !redoStack_.empty(); }

bool KRUndoManager::isUndoing() const { return replay_ == Replay::Undoing; }

bool KRUndoManager::isRedoing() const { return replay_ == Replay::Redoing; }

void KRUndoManager::disableUndoRegistration() { ++disableCount_; }

void KRUndoManager::enableUndoRegistration() {
  if (disableCount_ == 0)
    raiseInconsistency("enableUndoRegistration without a matching disableUndoRegistration");
  --disableCount_;
}

bool KRUndoManager::isUndoRegistrationEnabled() const { return disableCount_ == 0; }

void KRUndoManager::setLevelsOfUndo(size_t levels) {
  levelsOfUndo_ = levels;
  trim(undoStack_);
  trim(redoStack_);
}

size_t KRUndoManager::levelsOfUndo() const { return levelsOfUndo_; }

void KRUndoManager::removeAllActions() {
  undoStack_.clear();
  redoStack_.clear();
  for (const std::unique_ptr<Group>& group : openGroups_) group->entries.clear();
  disableCount_ = 0;
}

void KRUndoManager::removeAllActionsWithTarget(const std::shared_ptr<const void>& target) {
  for (GroupStack* stack : {&undoStack_, &redoStack_, &openGroups_}) {
    for (const std::unique_ptr<Group>& group : *stack) group->removeTarget(target);
  }
  for (GroupStack* stack : {&undoStack_, &redoStack_}) {
    std::erase_if(*stack, [](const std::unique_ptr<Group>& group) { return group->entries.empty(); });
  }
}

void KRUndoManager::setActionName(const KRString& name) {
  Group* group = openGroups_.empty() ? (undoStack_.empty() ? nullptr : undoStack_.back().get())
                                     : openGroups_.front().get();
  if (group) group->actionName = name ? name : KRString("");
}

KRString KRUndoManager::undoActionName() const {
  const Group* group = undoCandidate();
  return group ? group->actionName : KRString("");
}

KRString KRUndoManager::redoActionName() const {
  return redoStack_.empty() ? KRString("") : redoStack_.back()->actionName;
}

void KRUndoManager::registerAction(std::weak_ptr<const void> target, std::function<void()> invoke) {
  if (!isUndoRegistrationEnabled()) return;
  if (openGroups_.empty()) openAutomaticGroup();
  if (replay_ == Replay::None) redoStack_.clear();
  openGroups_.back()->entries.push_back(Group::Entry{std::move(target), std::move(invoke), nullptr});
}

void KRUndoManager::openAutomaticGroup() {
  if (!groupsByEvent_)
    raiseInconsistency("undo registration with no open undo group while not grouping by event");
  beginUndoGrouping();
  const uint64_t serial = ++lastAutomaticSerial_;
  openGroups_.back()->automaticSerial = serial;
  postAutomaticGroupClosing(serial);
}

void KRUndoManager::postAutomaticGroupClosing(uint64_t serial) {
  std::weak_ptr<KRUndoManager> weakSelf = std::static_pointer_cast<KRUndoManager>(shared_from_this());
  KRRunLoop::currentRunLoop()->performBlock([weakSelf, serial] {
    if (const std::shared_ptr<KRUndoManager> self = weakSelf.lock()) self->closeAutomaticGroup(serial);
  });
}

void KRUndoManager::closeAutomaticGroup(uint64_t serial) {
  if (openGroups_.empty() || openGroups_.front()->automaticSerial != serial) return;
  // A group opened inside it is still open: the automatic group closes once that one is closed, rather
  // than taking in the registrations of the turns to come.
  if (openGroups_.size() > 1) {
    openGroups_.front()->closingDue = true;
    return;
  }
  closeInnermostGroup();
}

void KRUndoManager::closeOpenAutomaticGroup() {
  if (openGroups_.size() == 1 && openGroups_.front()->automaticSerial != 0) closeInnermostGroup();
}

void KRUndoManager::closeInnermostGroup() {
  std::unique_ptr<Group> group = std::move(openGroups_.back());
  openGroups_.pop_back();
  if (openGroups_.size() == 1 && std::exchange(openGroups_.front()->closingDue, false))
    postAutomaticGroupClosing(openGroups_.front()->automaticSerial);
  if (group->entries.empty()) return;
  if (!openGroups_.empty()) {
    openGroups_.back()->entries.push_back(Group::Entry{{}, {}, std::move(group)});
    return;
  }
  push(replay_ == Replay::Undoing ? redoStack_ : undoStack_, std::move(group));
}

void KRUndoManager::replayNewest(GroupStack& stack, Replay replay) {
  if (!openGroups_.empty()) raiseInconsistency("undo or redo with an undo group still open");
  if (stack.empty()) return;
  const std::unique_ptr<Group> group = std::move(stack.back());
  stack.pop_back();
  ReplayScope scope(*this, replay, group->actionName);
  group->perform();
}

void KRUndoManager::push(GroupStack& stack, std::unique_ptr<Group> group) {
  stack.push_back(std::move(group));
  trim(stack);
}

void KRUndoManager::trim(GroupStack& stack) const {
  if (levelsOfUndo_ == 0 || stack.size() <= levelsOfUndo_) return;
  stack.erase(stack.begin(), stack.end() - static_cast<std::ptrdiff_t>(levelsOfUndo_));
}

const KRUndoManager::Group* KRUndoManager::undoCandidate() const {
  if (!openGroups_.empty() && !openGroups_.front()->entries.empty()) return openGroups_.front().get();
  return undoStack_.empty() ? nullptr : undoStack_.back().get();
}
