#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <utility>

#include "KRFoundation/KRObject.hpp"
#include "Support/KRDBInPlaceAllocator.hpp"

// The identity of one catalog object: its entity type and the id of its engine record. Immutable; the
// hash is computed once. Any thread may use an identifier.
class KRDBEntityID : public KRObject {
 public:
  static std::shared_ptr<KRDBEntityID> initWithEntityType(int64_t entityType, int64_t databaseID);

  int64_t entityType() const { return entityType_; }
  int64_t dbid() const { return dbid_; }
  uint64_t hash() const override { return hash_; }

  // True for an identifier (of this class or a subclass) with the same type and dbid.
  bool isEqual(const std::shared_ptr<const KRObject>& other) const override;
  // False for no identifier; otherwise whether type and dbid are both equal.
  bool isEqualTo(const std::shared_ptr<const KRDBEntityID>& other) const;
  // A new identifier with the same values.
  std::shared_ptr<KRDBEntityID> copyWithZone() const;
  // The default description, the type and the dbid: "<<KRDBEntityID: 0x...>: 1_42>".
  std::string description() const override;
  // "entityType" and "dbid" are readable by key, so predicates may name "entityID.dbid".
  KRValue valueForKey(const std::string& key) const override;

 protected:
  KRDBEntityID(int64_t entityType, int64_t databaseID);

 private:
  // Builds identifiers in place for KRDBInPlaceAllocator (a catalog holds several per image); as a member
  // it reaches the protected constructor.
  struct Builder {
    template <class U, class... Args>
    static void build(U* place, Args&&... args) {
      ::new (static_cast<void*>(place)) U(std::forward<Args>(args)...);
    }
  };

  uint64_t hash_;
  int64_t entityType_;
  int64_t dbid_;
};

using KRDBEntityIDPtr = std::shared_ptr<KRDBEntityID>;
