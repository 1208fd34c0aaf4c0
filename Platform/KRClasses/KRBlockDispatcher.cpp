#include "KRClasses/KRBlockDispatcher.hpp"

#include <exception>

#include "KRServices/KRLog.hpp"

std::shared_ptr<KRBlockDispatcher> KRBlockDispatcher::initWithDispatchQueue(
    std::shared_ptr<KRDispatchQueue> queue) {
  if (!queue) return nullptr;
  return std::shared_ptr<KRBlockDispatcher>(new KRBlockDispatcher(std::move(queue)));
}

void KRBlockDispatcher::performBlock(std::function<void()> block) {
  queue_->async([block = std::move(block), label = queue_->label()] {
    try {
      block();
    } catch (const std::exception& exception) {
      KRLog(2, "Exception in a block of %s: %s", label.c_str(), exception.what());
    } catch (...) {
      KRLog(2, "Exception in a block of %s: unknown exception", label.c_str());
    }
  });
}

void KRBlockDispatcher::performBlockAndWait(const std::function<void()>& block) { queue_->sync(block); }
