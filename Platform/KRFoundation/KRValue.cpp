#include "KRFoundation/KRValue.hpp"

#include "KRFoundation/KRHashing.hpp"

namespace {

// Keeps nil handles out of the storage: a nil handle of any kind is the nil value.
template <class Handle, class Storage>
Storage storageFor(Handle handle) {
  if (handle.isNil()) return Storage{};
  return Storage{std::move(handle)};
}

template <class Handle, class Storage>
Handle handleFrom(const Storage& storage) {
  const Handle* handle = std::get_if<Handle>(&storage);
  return handle ? *handle : Handle{};
}

std::string joined(const std::vector<KRValue>& values, const char* open, const char* close) {
  std::string text = open;
  for (size_t i = 0; i < values.size(); ++i) {
    if (i > 0) text += ", ";
    text += values[i].description();
  }
  return text + close;
}

}  // namespace

KRValue::KRValue(KRNumber number) : storage_(storageFor<KRNumber, Storage>(std::move(number))) {}
KRValue::KRValue(KRString string) : storage_(storageFor<KRString, Storage>(std::move(string))) {}
KRValue::KRValue(KRDate date) : storage_(storageFor<KRDate, Storage>(std::move(date))) {}
KRValue::KRValue(KRArray array) : storage_(storageFor<KRArray, Storage>(std::move(array))) {}
KRValue::KRValue(KRSet set) : storage_(storageFor<KRSet, Storage>(std::move(set))) {}
KRValue::KRValue(KRDictionary dictionary)
    : storage_(storageFor<KRDictionary, Storage>(std::move(dictionary))) {}
KRValue::KRValue(std::shared_ptr<KRObject> object) {
  if (object) storage_ = std::move(object);
}

KRNumber KRValue::number() const { return handleFrom<KRNumber>(storage_); }
KRString KRValue::string() const { return handleFrom<KRString>(storage_); }
KRDate KRValue::date() const { return handleFrom<KRDate>(storage_); }
KRArray KRValue::array() const { return handleFrom<KRArray>(storage_); }
KRSet KRValue::set() const { return handleFrom<KRSet>(storage_); }
KRDictionary KRValue::dictionary() const { return handleFrom<KRDictionary>(storage_); }
std::shared_ptr<KRObject> KRValue::object() const { return handleFrom<std::shared_ptr<KRObject>>(storage_); }

bool KRValue::operator==(const KRValue& other) const {
  if (storage_.index() != other.storage_.index()) return false;
  if (type() == Type::Object) return object()->isEqual(other.object());
  return storage_ == other.storage_;
}

uint64_t KRValue::hash() const {
  return std::visit(
      [](const auto& held) -> uint64_t {
        using T = std::decay_t<decltype(held)>;
        if constexpr (std::is_same_v<T, std::monostate>) {
          return 0;
        } else if constexpr (std::is_same_v<T, KRNull>) {
          return KRHashing::mix(1);
        } else if constexpr (std::is_same_v<T, std::shared_ptr<KRObject>>) {
          return held->hash();
        } else {
          return held.hash();
        }
      },
      storage_);
}

bool identical(const KRValue& a, const KRValue& b) {
  if (a.storage_.index() != b.storage_.index()) return false;
  return std::visit(
      [&b](const auto& held) -> bool {
        using T = std::decay_t<decltype(held)>;
        if constexpr (std::is_same_v<T, std::monostate> || std::is_same_v<T, KRNull>) {
          return true;
        } else if constexpr (std::is_same_v<T, std::shared_ptr<KRObject>>) {
          return held == std::get<T>(b.storage_);
        } else {
          return identical(held, std::get<T>(b.storage_));
        }
      },
      a.storage_);
}

std::string KRValue::description() const {
  switch (type()) {
    case Type::Nil:
      return "(null)";
    case Type::Null:
      return "<null>";
    case Type::Number:
      return number().stringValue();
    case Type::String:
      return string().str();
    case Type::Date:
      return date().description();
    case Type::Array:
      return joined(array().values(), "(", ")");
    case Type::Set:
      return joined(set().allObjects(), "{(", ")}");
    case Type::Dictionary: {
      std::string text = "{";
      for (const auto& [key, value] : dictionary().entries())
        text += key.description() + " = " + value.description() + "; ";
      if (text.size() > 1) text.pop_back();
      return text + "}";
    }
    case Type::Object:
      return object()->description();
  }
  return "";
}

KRValue KRValue::valueForKey(const std::string& key) const {
  switch (type()) {
    case Type::Nil:
    case Type::Null:
      return KRValue();
    case Type::Dictionary:
      return dictionary().objectForKey(key);
    case Type::Array:
      return mappedArray(key);
    case Type::Set:
      return mappedSet(key);
    case Type::Date:
      if (key == "timeIntervalSince1970") return date().timeIntervalSince1970();
      break;
    case Type::Object:
      return object()->valueForKey(key);
    default:
      break;
  }
  KRObject::raiseUndefinedKey(description(), "valueForUndefinedKey:", key);
}

KRValue KRValue::mappedArray(const std::string& key) const {
  if (key == "@count") return static_cast<unsigned long long>(array().count());
  std::vector<KRValue> mapped;
  mapped.reserve(array().count());
  // Elements without a value for the key answer null, so the result keeps the array's positions.
  for (const auto& element : array().values()) {
    KRValue value = element.valueForKey(key);
    mapped.push_back(value.isNil() ? KRValue::null() : std::move(value));
  }
  return KRArray(std::move(mapped));
}

KRValue KRValue::mappedSet(const std::string& key) const {
  if (key == "@count") return static_cast<unsigned long long>(set().count());
  std::vector<KRValue> mapped;
  mapped.reserve(set().count());
  for (const auto& member : set().allObjects()) {
    KRValue value = member.valueForKey(key);
    if (!value.isNil()) mapped.push_back(std::move(value));
  }
  return KRSet(mapped);
}

KRValue KRValue::valueForKeyPath(const std::string& keyPath) const {
  const size_t dot = keyPath.find('.');
  if (dot == std::string::npos) return valueForKey(keyPath);
  return valueForKey(keyPath.substr(0, dot)).valueForKeyPath(keyPath.substr(dot + 1));
}
