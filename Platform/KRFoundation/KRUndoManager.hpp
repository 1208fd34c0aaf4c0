#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <memory>
#include <type_traits>
#include <vector>

#include "KRFoundation/KRObject.hpp"
#include "KRFoundation/KRString.hpp"

// Records undo actions in groups and replays them, like the platform's undo manager. Used from one
// thread; that thread's run loop closes the automatic groups.
//
// - Registrations go into the innermost open group. Closing a nested group makes it one entry of its
//   parent; closing a top-level group pushes it onto the undo stack (onto the redo stack while undoing).
//   An empty group is dropped.
// - undo() takes the newest undo group and runs its actions in reverse registration order inside a new
//   group, whose registrations become the redo group. redo() is symmetric; its registrations go back to
//   the undo stack. A registration made while neither undoing nor redoing clears the redo stack.
// - Targets are held weakly: an action whose target is gone is skipped. Targets are compared by owner
//   (the object their shared_ptr manages), so a base and a derived pointer to one object are one target.
// - Groups by event (the default): a registration while no group is open opens an automatic group that a
//   block posted to the current run loop closes at the end of this run-loop turn. undo() and redo() close
//   an open automatic top-level group first; with a group opened by the caller still open, they (and
//   undoNestedGroup(), which never closes groups) raise NSInternalInconsistencyException. Without groups
//   by event, registering while no group is open raises NSInternalInconsistencyException.
// - Disabling is counted; registration while disabled is ignored.
// - levelsOfUndo (0: unlimited) keeps that many newest groups on each stack.
// - removeAllActions() clears both stacks and the actions of the open groups (which stay open, so that
//   begin/end calls stay balanced) and enables registration again.
// - Action names belong to groups: setActionName() names the open top-level group, or the newest undo
//   group when none is open. A group's name passes to the group that undoing or redoing it records.
// - canUndo() is true when the undo stack holds a group or the open top-level group holds actions; the
//   undo action name is that group's.
class KRUndoManager : public KRObject {
 public:
  static std::shared_ptr<KRUndoManager> undoManager();
  ~KRUndoManager() override;

  void beginUndoGrouping();
  // Raises NSInternalInconsistencyException when no group is open.
  void endUndoGrouping();
  // Ends the innermost group if one is open; otherwise does nothing.
  void kr_endUndoGrouping();
  int groupingLevel() const;
  bool groupsByEvent() const;
  void setGroupsByEvent(bool groupsByEvent);

  // Registers an undo action for a weakly held target: when undone, the action is called with the target
  // if it still lives. An empty target or action is ignored.
  template <class T>
  void prepareWithInvocationTarget(
      const std::shared_ptr<T>& target,
      std::type_identity_t<std::function<void(const std::shared_ptr<T>&)>> action) {
    if (!target || !action) return;
    registerAction(target, [weakTarget = std::weak_ptr<T>(target), action = std::move(action)] {
      if (const std::shared_ptr<T> liveTarget = weakTarget.lock()) action(liveTarget);
    });
  }

  void undo();
  void redo();
  void undoNestedGroup();
  bool canUndo() const;
  bool canRedo() const;
  bool isUndoing() const;
  bool isRedoing() const;

  void disableUndoRegistration();
  // Raises NSInternalInconsistencyException without a matching disableUndoRegistration().
  void enableUndoRegistration();
  bool isUndoRegistrationEnabled() const;

  void setLevelsOfUndo(size_t levels);
  size_t levelsOfUndo() const;

  void removeAllActions();
  void removeAllActionsWithTarget(const std::shared_ptr<const void>& target);

  void setActionName(const KRString& name);
  // The name of the group undo() or redo() would replay; empty when there is none.
  KRString undoActionName() const;
  KRString redoActionName() const;

 private:
  struct Group;
  using GroupStack = std::vector<std::unique_ptr<Group>>;
  enum class Replay { None, Undoing, Redoing };
  class ReplayScope;

  KRUndoManager();
  void registerAction(std::weak_ptr<const void> target, std::function<void()> invoke);
  void openAutomaticGroup();
  void closeAutomaticGroup(uint64_t serial);
  void postAutomaticGroupClosing(uint64_t serial);
  void closeOpenAutomaticGroup();
  void closeInnermostGroup();
  void replayNewest(GroupStack& stack, Replay replay);
  void push(GroupStack& stack, std::unique_ptr<Group> group);
  void trim(GroupStack& stack) const;
  const Group* undoCandidate() const;

  GroupStack undoStack_;
  GroupStack redoStack_;
  GroupStack openGroups_;
  Replay replay_ = Replay::None;
  bool groupsByEvent_ = true;
  int disableCount_ = 0;
  size_t levelsOfUndo_ = 0;
  uint64_t lastAutomaticSerial_ = 0;
};
