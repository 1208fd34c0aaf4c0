#include "KRFoundation/KRUUID.hpp"

#include <uuid/uuid.h>

KRString KRUUID::UUIDString() {
  uuid_t uuid;
  uuid_generate_random(uuid);
  char text[37];
  uuid_unparse_upper(uuid, text);
  return KRString(text);
}
