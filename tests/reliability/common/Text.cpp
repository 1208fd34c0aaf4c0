#include "Text.hpp"

namespace reliability {

std::string Text::join(const std::vector<std::string>& items, const std::string& separator) {
  std::string text;
  for (size_t index = 0; index < items.size(); ++index) text += (index > 0 ? separator : "") + items[index];
  return text;
}

}  // namespace reliability
