#pragma once

#include <array>
#include <string_view>

#include "KRServices/KRLogArgument.hpp"
#include "KRServices/KRLogger.hpp"

#ifndef KR_SOURCE_ROOT
#define KR_SOURCE_ROOT ""
#endif

// The source path that log lines carry: the file's path below the repository root, without its
// extension ("/repo/Platform/KRServices/KRLog.cpp" -> "Platform/KRServices/KRLog"). The build writes
// __FILE__ without the root, or relative to the build folder when a compiler cache rewrites the paths
// ("../../Platform/KRServices/KRLog.cpp"): leading "../" steps are dropped too.
consteval std::string_view KRLogSourcePath(std::string_view file, std::string_view root) {
  if (!root.empty() && file.starts_with(root)) file.remove_prefix(root.size());
  while (file.starts_with("../")) file.remove_prefix(3);
  const size_t slash = file.rfind('/');
  const size_t dot = file.rfind('.');
  const size_t nameStart = slash == std::string_view::npos ? 0 : slash + 1;
  if (dot != std::string_view::npos && dot > nameStart) file = file.substr(0, dot);
  return file;
}

// Logs one line: `format` is printf-style with `%@` for object descriptions (see KRLogFormatter),
// the arguments are numbers, texts, value handles, objects, pointers or exceptions. `flags` is
// reserved; callers pass 0.
template <class... Args>
void __KRLog([[maybe_unused]] int flags, int level, std::string_view sourcePath, std::string_view function,
             int line, const char* format, const Args&... args) {
  const std::array<KRLogArgument, sizeof...(Args)> arguments{KRLogArgument(args)...};
  KRLogger::log(level, sourcePath, function, line, format, arguments);
}

// Logs from the calling function, with its source path, name and line.
#define KRLog(level, format, ...)                                                    \
  __KRLog(0, (level), KRLogSourcePath(__FILE__, KR_SOURCE_ROOT), __func__, __LINE__, \
          (format)__VA_OPT__(, ) __VA_ARGS__)
