#include "dbsqlrow.hpp"

#include <cstring>
#include <string>

#include "dbstrings.hpp"

namespace dbcore {

DBSqlValue DBSqlRow::storedValue(const TVariant& variant, std::string& text) {
  switch (variant.type()) {
    case FieldType::T_NONE:
      return DBSqlValue();
    case FieldType::T_FLOAT:
      return DBSqlValue::real(variant.asDouble());
    case FieldType::T_TEXT:
      text = variant.asText();
      return DBSqlValue::text(text);
    case FieldType::T_WIDE_TEXT:
      text = ws2s(variant.asWideText());
      return DBSqlValue::text(text);
    default:
      return DBSqlValue::integer(variant.asInt64());
  }
}

DBSqlRow::DBSqlRow(const std::vector<DBSqlValue>& values) : size_(values.size()) {
  std::size_t textBytes = 0;
  for (const DBSqlValue& value : values) textBytes += value.viewsText() ? value.asText().size() : 0;
  block_ = std::make_unique_for_overwrite<std::byte[]>(size_ * sizeof(DBSqlValue) + textBytes);
  auto* cursor = reinterpret_cast<char*>(block_.get() + size_ * sizeof(DBSqlValue));
  for (std::size_t index = 0; index < size_; ++index) {
    DBSqlValue value = values[index];
    if (value.viewsText()) {
      const std::string_view text = value.asText();
      if (!text.empty()) std::memcpy(cursor, text.data(), text.size());
      value = DBSqlValue::text(std::string_view(cursor, text.size()));
      cursor += text.size();
    }
    new (block_.get() + index * sizeof(DBSqlValue)) DBSqlValue(value);
  }
}

DBSqlRow::DBSqlRow(const std::vector<TVariant>& variants) {
  std::vector<std::string> texts(variants.size());
  std::vector<DBSqlValue> values;
  values.reserve(variants.size());
  for (std::size_t index = 0; index < variants.size(); ++index) {
    values.push_back(storedValue(variants[index], texts[index]));
  }
  *this = DBSqlRow(values);
}

bool DBSqlRow::holdsSameValues(const DBSqlRow& other) const {
  if (size_ != other.size_) return false;
  for (std::size_t index = 0; index < size_; ++index) {
    const DBSqlValue& mine = (*this)[index];
    const DBSqlValue& theirs = other[index];
    if (mine.storageClass() != theirs.storageClass()) return false;
    if (!mine.isNull() && DBSqlValue::compare(mine, theirs) != 0) return false;
  }
  return true;
}

}  // namespace dbcore
