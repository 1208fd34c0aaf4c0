#include "support/KRUnprivilegedUser.hpp"

#include <unistd.h>

namespace {
constexpr uid_t kNobody = 65534;
}

KRUnprivilegedUser::KRUnprivilegedUser(const std::filesystem::path& folder) {
  if (geteuid() != 0) return;
  std::filesystem::permissions(folder, std::filesystem::perms::all);
  switched_ = setegid(kNobody) == 0 && seteuid(kNobody) == 0;
}

KRUnprivilegedUser::~KRUnprivilegedUser() {
  if (!switched_) return;
  if (seteuid(0) != 0 || setegid(0) != 0) _exit(70);
}
