#pragma once

#include <sys/types.h>

#include <filesystem>

// While it exists, the process works with an ordinary user's rights when it runs as the superuser (and
// opens the given folder to that user); otherwise it changes nothing.
class KRUnprivilegedUser {
 public:
  explicit KRUnprivilegedUser(const std::filesystem::path& folder);
  ~KRUnprivilegedUser();
  KRUnprivilegedUser(const KRUnprivilegedUser&) = delete;
  KRUnprivilegedUser& operator=(const KRUnprivilegedUser&) = delete;

 private:
  bool switched_ = false;
};
