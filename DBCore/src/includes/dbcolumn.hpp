#pragma once

#include <cstdint>
#include <string>

#include "tvariant.hpp"

namespace dbcore {

class DBStatement;

// One column of a record type: its name, type, how to read and write it on a record and how to bind
// the record's value to a statement parameter without an intermediate value.
template <class Record>
struct DBColumn {
  const char* name;
  FieldType type;
  TVariant (*get)(const Record&);
  void (*set)(Record&, const TVariant&);
  void (*bind)(DBStatement&, int, const Record&);
};

}  // namespace dbcore
