#include "KRClasses/KRTCropDescription.hpp"

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <cmath>
#include <initializer_list>
#include <optional>
#include <string_view>
#include <utility>
#include <vector>

#include "KRFoundation/KRHashing.hpp"

namespace {

// Nesting limit of the property-list reader, so that hostile text cannot exhaust the stack.
constexpr int kMaxDepth = 32;

constexpr std::string_view kPlistHeader =
    "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
    "<!DOCTYPE plist PUBLIC \"-//Apple//DTD PLIST 1.0//EN\" "
    "\"http://www.apple.com/DTDs/PropertyList-1.0.dtd\">\n"
    "<plist version=\"1.0\">\n";
constexpr std::string_view kPlistFooter = "</plist>\n";

// The shortest text that reads back as the same double.
std::string realText(double value) {
  std::array<char, 32> buffer;
  const auto result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value);
  return std::string(buffer.data(), result.ptr);
}

// Reads the numbers at the keys of a dictionary into the fields; false when one is missing or is not a
// number.
bool readNumbers(const KRDictionary& dictionary,
                 std::initializer_list<std::pair<const char*, double*>> fields) {
  for (const auto& [key, field] : fields) {
    const KRNumber number = dictionary.objectForKey(key).number();
    if (number.isNil()) return false;
    *field = number.doubleValue();
  }
  return true;
}

bool allFinite(std::initializer_list<double> values) {
  return std::all_of(values.begin(), values.end(), [](double value) { return std::isfinite(value); });
}

// Equal doubles give equal bits, except that -0 and +0 are equal: both hash as +0.
uint64_t hashBits(double value) { return std::bit_cast<uint64_t>(value == 0 ? 0.0 : value); }

// Writing: a dictionary of dictionaries and numbers, one element per line, indented by tabs.

void appendElement(std::string& xml, const KRValue& value, size_t depth);

void appendDictionary(std::string& xml, const KRDictionary& dictionary, size_t depth) {
  const std::string indent(depth, '\t');
  xml += indent + "<dict>\n";
  for (const auto& [key, value] : dictionary.entries()) {
    xml += indent + "\t<key>" + key.string().str() + "</key>\n";
    appendElement(xml, value, depth + 1);
  }
  xml += indent + "</dict>\n";
}

void appendElement(std::string& xml, const KRValue& value, size_t depth) {
  if (value.type() == KRValue::Type::Dictionary) return appendDictionary(xml, value.dictionary(), depth);
  xml += std::string(depth, '\t') + "<real>" + realText(value.number().doubleValue()) + "</real>\n";
}

// Reading: each function consumes what it reads from the front of the text.

struct Tag {
  std::string_view name;
  bool closing = false;  // </name>
  bool empty = false;    // <name/>
};

bool isXMLWhitespace(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

bool isNameCharacter(char c) {
  return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_' || c == '-' ||
         c == ':' || c == '.';
}

std::string_view trimmed(std::string_view text) {
  while (!text.empty() && isXMLWhitespace(text.front())) text.remove_prefix(1);
  while (!text.empty() && isXMLWhitespace(text.back())) text.remove_suffix(1);
  return text;
}

bool consume(std::string_view& text, std::string_view prefix) {
  if (!text.starts_with(prefix)) return false;
  text.remove_prefix(prefix.size());
  return true;
}

bool skipPast(std::string_view& text, std::string_view terminator) {
  const size_t position = text.find(terminator);
  if (position == std::string_view::npos) return false;
  text.remove_prefix(position + terminator.size());
  return true;
}

// Skips whitespace, comments and processing instructions; false at an unterminated one.
bool skipMisc(std::string_view& text) {
  while (true) {
    while (!text.empty() && isXMLWhitespace(text.front())) text.remove_prefix(1);
    if (text.starts_with("<!--")) {
      if (!skipPast(text, "-->")) return false;
    } else if (text.starts_with("<?")) {
      if (!skipPast(text, "?>")) return false;
    } else {
      return true;
    }
  }
}

// The byte offset of the ">" that ends a tag, skipping quoted attribute values; npos when missing.
size_t tagEnd(std::string_view text) {
  char quote = 0;
  for (size_t i = 0; i < text.size(); ++i) {
    const char c = text[i];
    if (quote != 0) {
      if (c == quote) quote = 0;
    } else if (c == '"' || c == '\'') {
      quote = c;
    } else if (c == '>') {
      return i;
    }
  }
  return std::string_view::npos;
}

// A start, end or empty-element tag; attributes of start tags are skipped.
std::optional<Tag> readTag(std::string_view& text) {
  if (!consume(text, "<")) return std::nullopt;
  Tag tag;
  tag.closing = consume(text, "/");
  const size_t nameLength =
      static_cast<size_t>(std::find_if_not(text.begin(), text.end(), isNameCharacter) - text.begin());
  const size_t end = tagEnd(text);
  if (nameLength == 0 || end == std::string_view::npos) return std::nullopt;
  tag.name = text.substr(0, nameLength);
  const std::string_view rest = text.substr(nameLength, end - nameLength);
  text.remove_prefix(end + 1);
  tag.empty = rest.ends_with('/');
  if (tag.closing && !trimmed(rest).empty()) return std::nullopt;
  return tag;
}

bool readEndTag(std::string_view& text, std::string_view name) {
  const std::optional<Tag> tag = readTag(text);
  return tag && tag->closing && tag->name == name;
}

// Character data with the five predefined entities replaced; nullopt at any other "&".
std::optional<std::string> decodedText(std::string_view raw) {
  static constexpr std::array<std::pair<std::string_view, char>, 5> entities = {
      {{"&amp;", '&'}, {"&lt;", '<'}, {"&gt;", '>'}, {"&quot;", '"'}, {"&apos;", '\''}}};
  std::string text;
  while (!raw.empty()) {
    if (raw.front() != '&') {
      text.push_back(raw.front());
      raw.remove_prefix(1);
      continue;
    }
    const auto entity = std::find_if(entities.begin(), entities.end(), [raw](const auto& candidate) {
      return raw.starts_with(candidate.first);
    });
    if (entity == entities.end()) return std::nullopt;
    text.push_back(entity->second);
    raw.remove_prefix(entity->first.size());
  }
  return text;
}

// The text of an element whose start tag was read, through its end tag.
std::optional<std::string> readElementText(std::string_view& text, std::string_view name) {
  const size_t end = text.find('<');
  if (end == std::string_view::npos) return std::nullopt;
  std::optional<std::string> content = decodedText(text.substr(0, end));
  text.remove_prefix(end);
  if (!content || !readEndTag(text, name)) return std::nullopt;
  return content;
}

// The whole text, surrounding whitespace aside, as a number of type T.
template <class T>
std::optional<KRValue> parsedNumber(std::string_view text) {
  const std::string_view digits = trimmed(text);
  T value{};
  const auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), value);
  if (error != std::errc{} || end != digits.data() + digits.size()) return std::nullopt;
  return KRValue(value);
}

std::optional<KRValue> readValue(std::string_view& text, int depth);

std::optional<KRValue> readDictionaryEntries(std::string_view& text, int depth) {
  std::vector<KRDictionary::Entry> entries;
  while (true) {
    if (!skipMisc(text)) return std::nullopt;
    const std::optional<Tag> tag = readTag(text);
    if (!tag) return std::nullopt;
    if (tag->closing)
      return tag->name == "dict" ? std::optional<KRValue>(KRDictionary(entries)) : std::nullopt;
    if (tag->name != "key") return std::nullopt;
    const std::optional<std::string> key = tag->empty ? std::string() : readElementText(text, "key");
    if (!key) return std::nullopt;
    std::optional<KRValue> value = readValue(text, depth + 1);
    if (!value) return std::nullopt;
    entries.emplace_back(*key, std::move(*value));
  }
}

std::optional<KRValue> readValue(std::string_view& text, int depth) {
  if (depth > kMaxDepth || !skipMisc(text)) return std::nullopt;
  const std::optional<Tag> tag = readTag(text);
  if (!tag || tag->closing) return std::nullopt;
  if (tag->name == "dict") {
    return tag->empty ? std::optional<KRValue>(KRDictionary::dictionary())
                      : readDictionaryEntries(text, depth);
  }
  if (tag->empty || (tag->name != "real" && tag->name != "integer")) return std::nullopt;
  const std::optional<std::string> content = readElementText(text, tag->name);
  if (!content) return std::nullopt;
  return tag->name == "real" ? parsedNumber<double>(*content) : parsedNumber<long long>(*content);
}

// Skips a byte order mark, the XML declaration, the document type and whatever misc surrounds them.
bool skipProlog(std::string_view& text) {
  consume(text, "\xEF\xBB\xBF");
  if (!skipMisc(text)) return false;
  if (text.starts_with("<!DOCTYPE") && !skipPast(text, ">")) return false;
  return skipMisc(text);
}

// The value of an XML property-list document; nullopt for anything malformed.
std::optional<KRValue> parsePropertyList(std::string_view text) {
  if (!skipProlog(text)) return std::nullopt;
  const std::optional<Tag> plist = readTag(text);
  if (!plist || plist->closing || plist->empty || plist->name != "plist") return std::nullopt;
  std::optional<KRValue> value = readValue(text, 0);
  if (!value || !skipMisc(text) || !readEndTag(text, "plist") || !skipMisc(text) || !text.empty()) {
    return std::nullopt;
  }
  return value;
}

}  // namespace

std::shared_ptr<KRTCropDescription> KRTCropDescription::initWithCropRect(const KRRect& cropRect,
                                                                         const KRSize& imageSize) {
  if (!allFinite({cropRect.origin.x, cropRect.origin.y, cropRect.size.width, cropRect.size.height,
                  imageSize.width, imageSize.height})) {
    return nullptr;
  }
  return std::shared_ptr<KRTCropDescription>(new KRTCropDescription(cropRect, imageSize));
}

std::shared_ptr<KRTCropDescription> KRTCropDescription::initWithDictionary(const KRDictionary& dictionary) {
  KRRect cropRect;
  KRSize imageSize;
  const bool complete =
      readNumbers(dictionary.objectForKey("cropRect").dictionary(), {{"x", &cropRect.origin.x},
                                                                     {"y", &cropRect.origin.y},
                                                                     {"width", &cropRect.size.width},
                                                                     {"height", &cropRect.size.height}}) &&
      readNumbers(dictionary.objectForKey("imageSize").dictionary(),
                  {{"width", &imageSize.width}, {"height", &imageSize.height}});
  return complete ? initWithCropRect(cropRect, imageSize) : nullptr;
}

std::shared_ptr<KRTCropDescription> KRTCropDescription::initWithPlistSerialization(const std::string& xml) {
  const std::optional<KRValue> value = parsePropertyList(xml);
  return value ? initWithDictionary(value->dictionary()) : nullptr;
}

std::shared_ptr<KRTCropDescription> KRTCropDescription::convertToImageSize(const KRSize& newSize) const {
  if (imageSize_.width == 0 || imageSize_.height == 0) return nullptr;
  const double scaleX = newSize.width / imageSize_.width;
  const double scaleY = newSize.height / imageSize_.height;
  const KRRect scaled{{cropRect_.origin.x * scaleX, cropRect_.origin.y * scaleY},
                      {cropRect_.size.width * scaleX, cropRect_.size.height * scaleY}};
  return initWithCropRect(scaled, newSize);
}

KRDictionary KRTCropDescription::cropDescriptionDictionary() const {
  return KRDictionary{
      {"cropRect", KRDictionary{{"x", cropRect_.origin.x},
                                {"y", cropRect_.origin.y},
                                {"width", cropRect_.size.width},
                                {"height", cropRect_.size.height}}},
      {"imageSize", KRDictionary{{"width", imageSize_.width}, {"height", imageSize_.height}}},
  };
}

std::string KRTCropDescription::plistSerialization() const {
  std::string xml(kPlistHeader);
  appendDictionary(xml, cropDescriptionDictionary(), 0);
  xml += kPlistFooter;
  return xml;
}

std::string KRTCropDescription::description() const {
  return "<KRTCropDescription: cropRect {{" + realText(cropRect_.origin.x) + ", " +
         realText(cropRect_.origin.y) + "}, {" + realText(cropRect_.size.width) + ", " +
         realText(cropRect_.size.height) + "}}, imageSize {" + realText(imageSize_.width) + ", " +
         realText(imageSize_.height) + "}>";
}

bool KRTCropDescription::isEqual(const std::shared_ptr<const KRObject>& other) const {
  const auto crop = std::dynamic_pointer_cast<const KRTCropDescription>(other);
  return crop && crop->cropRect_ == cropRect_ && crop->imageSize_ == imageSize_;
}

uint64_t KRTCropDescription::hash() const {
  uint64_t hash = 0;
  for (double value : {cropRect_.origin.x, cropRect_.origin.y, cropRect_.size.width, cropRect_.size.height,
                       imageSize_.width, imageSize_.height}) {
    hash = KRHashing::combine(hash, hashBits(value));
  }
  return hash;
}
