#include "dbstaticsql.hpp"

#include <atomic>
#include <utility>

namespace dbcore {

namespace {

std::size_t nextSlot() {
  static std::atomic<std::size_t> slots{0};
  return slots.fetch_add(1, std::memory_order_relaxed);
}

}  // namespace

DBStaticSql::DBStaticSql(std::string text) : text_(std::move(text)), slot_(nextSlot()) {}

}  // namespace dbcore
