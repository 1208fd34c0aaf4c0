#pragma once

#include <string>
#include <vector>

namespace reliability {

// Text helpers of the harnesses' reports.
class Text {
 public:
  static std::string join(const std::vector<std::string>& items, const std::string& separator);
};

}  // namespace reliability
