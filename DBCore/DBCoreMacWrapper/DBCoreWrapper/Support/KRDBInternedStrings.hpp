#pragma once

#include <cstddef>
#include <string>

#include "KRFoundation/KRString.hpp"

// One shared string object for each short text that repeats across many records (camera and lens names),
// so that the records of a million images hold each name once and convert it once. Each thread keeps its
// own bounded table (emptied when full); no locking.
class KRDBInternedStrings {
 public:
  // Texts longer than this are converted each time: they rarely repeat.
  static constexpr size_t kLongestInterned = 64;
  // The table is emptied when it holds this many texts.
  static constexpr size_t kCapacity = 4096;

  // The string of the wide text: the same object as for an equal text converted before on this thread.
  static KRString string(const std::wstring& wide);
};
