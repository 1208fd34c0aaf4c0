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

std::vector<DBSqlValue> DBSqlRow::storedValues(const std::vector<TVariant>& variants,
                                               std::vector<std::string>& texts) {
  texts.assign(variants.size(), std::string());
  std::vector<DBSqlValue> values;
  values.reserve(variants.size());
  for (std::size_t index = 0; index < variants.size(); ++index) {
    values.push_back(storedValue(variants[index], texts[index]));
  }
  return values;
}

std::size_t DBSqlRow::blockSize(std::span<const DBSqlValue> values) {
  std::size_t textBytes = 0;
  for (const DBSqlValue& value : values) textBytes += value.viewsText() ? value.asText().size() : 0;
  return values.size() * sizeof(DBSqlValue) + textBytes;
}

void DBSqlRow::writeBlock(std::span<const DBSqlValue> values, std::byte* block) {
  auto* cursor = reinterpret_cast<char*>(block + values.size() * sizeof(DBSqlValue));
  for (std::size_t index = 0; index < values.size(); ++index) {
    DBSqlValue value = values[index];
    if (value.viewsText()) {
      const std::string_view text = value.asText();
      if (!text.empty()) std::memcpy(cursor, text.data(), text.size());
      value = DBSqlValue::text(std::string_view(cursor, text.size()));
      cursor += text.size();
    }
    new (block + index * sizeof(DBSqlValue)) DBSqlValue(value);
  }
}

DBSqlRow::DBSqlRow(const std::vector<DBSqlValue>& values)
    : block_(std::make_unique_for_overwrite<std::byte[]>(blockSize(values))), size_(values.size()) {
  writeBlock(values, block_.get());
}

DBSqlRow::DBSqlRow(const std::vector<TVariant>& variants) {
  std::vector<std::string> texts;
  *this = DBSqlRow(storedValues(variants, texts));
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
