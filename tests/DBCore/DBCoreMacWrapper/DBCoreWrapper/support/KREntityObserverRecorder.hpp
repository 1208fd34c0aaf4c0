#pragma once

#include <memory>
#include <string>
#include <vector>

#include "KRClasses/KRAbstractModel.hpp"
#include "KRFoundation/KRObject.hpp"
#include "Model/KRDBEntity/KRDBEntityObserver.hpp"

// Records every notification an entity posts, in order: the kind and the info.
class KREntityObserverRecorder : public KRObject, public KRDBEntityObserver {
 public:
  struct Event {
    std::string kind;
    KRDictionary info;
  };

  static std::shared_ptr<KREntityObserverRecorder> observing(KRAbstractModel& model) {
    std::shared_ptr<KREntityObserverRecorder> recorder(new KREntityObserverRecorder());
    model.addListener(recorder);
    return recorder;
  }

  void entityWillChange(const std::shared_ptr<KRDBEntity>&, const KRDictionary& info) override {
    events.push_back({"willChange", info});
  }
  void entityDidChange(const std::shared_ptr<KRDBEntity>&, const KRDictionary& info) override {
    events.push_back({"didChange", info});
  }
  void validationRecordDidSet(const std::shared_ptr<KRDBEntity>&) override {
    events.push_back({"validationRecordDidSet", {}});
  }

  std::vector<std::string> kinds() const {
    std::vector<std::string> result;
    for (const auto& event : events) result.push_back(event.kind);
    return result;
  }

  std::vector<Event> events;

 private:
  KREntityObserverRecorder() = default;
};
