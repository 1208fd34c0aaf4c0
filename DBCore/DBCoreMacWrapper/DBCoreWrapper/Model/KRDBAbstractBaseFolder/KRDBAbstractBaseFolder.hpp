#pragma once

#include <memory>
#include <string>
#include <vector>

#include "KRFoundation/KRValue.hpp"
#include "Model/KRDBBaseFolderAttributes/KRDBBaseFolderAttributes.hpp"
#include "Model/KRDBEntity/KRDBEntity.hpp"

// Change keys of the folders' name and order.
extern const char* const kKRDBBaseFolderDidChangeName;
extern const char* const kKRDBBaseFolderDidChangeOrder;

// The abstract base of the folder-like entities (collections, smart filters, referenced folders), which live
// in trees. The tree links and the member images are not in the folder's record: they are asked of the
// context on first read and cached here. A folder holds its children, images and attributes strongly and its
// parent weakly (the parent holds the child; the context's cache keeps both). Has no type numbers of its own.
// Used on its context's thread.
class KRDBAbstractBaseFolder : public KRDBEntity {
 public:
  using EntitySetPtr = std::shared_ptr<const KRDBEntitySet>;

  // A folder is handed out only with its attribute record: "attributesPrimitive".
  static const std::vector<std::string>& necessaryLinkedEntitiesKeys();

  // ---- Tree and members, asked of the context when not cached (nil without a context)
  std::shared_ptr<KRDBAbstractBaseFolder> parent();
  // Caches the parent; a different one posts a relation change.
  void setParent(const std::shared_ptr<KRDBAbstractBaseFolder>& parent);
  std::shared_ptr<KRDBAbstractBaseFolder> parentPrimitive() const { return parent_.lock(); }
  void setParentPrimitive(const std::shared_ptr<KRDBAbstractBaseFolder>& parent) { parent_ = parent; }
  EntitySetPtr images();
  EntitySetPtr childs();

  // ---- Cached sets. The setters compare set objects; a different object posts a relation change
  // (the children only when asked to); setChildsPrimitive never posts.
  EntitySetPtr imagesPrimitive() const { return images_; }
  void setImagesPrimitive(EntitySetPtr images);
  EntitySetPtr childsPrimitive() const { return childs_; }
  void setChildsPrimitive(EntitySetPtr childs) { childs_ = std::move(childs); }
  void setSubfiltersPrimitive(EntitySetPtr childs, bool notify);
  void setSubfiltersPrimitive(EntitySetPtr childs);
  // Adds the entities not yet members (one notification when any) and answers those.
  KRDBEntitySet addImagesPrimitive(const KRDBEntitySet& images);
  KRDBEntitySet addChildsPrimitive(const KRDBEntitySet& childs);
  // Removes the entities that are members (one notification when any) and answers those.
  KRDBEntitySet deleteImagesPrimitive(const KRDBEntitySet& images);
  KRDBEntitySet deleteChildsPrimitive(const KRDBEntitySet& childs);

  // ---- Fields: plain accessors here; the kinds that store them follow the setter protocol.
  virtual const KRString& name() { return name_; }
  virtual void setName(const KRString& name) { name_ = name; }
  virtual double order() const { return order_; }
  virtual void setOrder(double order) { order_ = order; }

  // ---- Attribute record, a necessary linked entity
  std::shared_ptr<KRDBBaseFolderAttributes> attributes() const { return attributes_; }
  std::shared_ptr<KRDBBaseFolderAttributes> attributesPrimitive() const { return attributes_; }
  void setAttributesPrimitive(std::shared_ptr<KRDBBaseFolderAttributes> attributes) {
    attributes_ = std::move(attributes);
  }

  // ---- Membership changes through the context
  void addChild(const std::shared_ptr<KRDBAbstractBaseFolder>& child);
  void addChilds(const KRDBEntitySet& childs);
  // Each kind defines how images join and leave it; a folder of no kind does nothing.
  virtual void addImages(const KRDBEntitySet& images);
  virtual void removeImages(const KRDBEntitySet& images);

  KRValue valueForKey(const std::string& key) const override;
  void setValueForKey(const KRValue& value, const std::string& key) override;

 protected:
  using KRDBEntity::KRDBEntity;
  std::shared_ptr<KRDBAbstractBaseFolder> selfFolder() {
    return std::static_pointer_cast<KRDBAbstractBaseFolder>(self());
  }

  KRString name_;
  double order_ = 0;

 private:
  std::weak_ptr<KRDBAbstractBaseFolder> parent_;
  EntitySetPtr images_;
  EntitySetPtr childs_;
  std::shared_ptr<KRDBBaseFolderAttributes> attributes_;
};
