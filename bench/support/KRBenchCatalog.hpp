#pragma once

#include <string>

// A catalog file for the benchmarks, written through the engine in a few large writes: two volumes,
// folders alternating between them, images spread over the folders, each with user attributes, exif
// attributes and one current history state. Any thread; the file is replaced.
namespace KRBenchCatalog {

void build(const std::string& path, int images, int folders);

}  // namespace KRBenchCatalog
