#pragma once

// Plain geometry values in doubles. Equality compares every member exactly.

struct KRPoint {
  double x = 0;
  double y = 0;
  bool operator==(const KRPoint&) const = default;
};

struct KRSize {
  double width = 0;
  double height = 0;
  bool operator==(const KRSize&) const = default;
};

struct KRRect {
  KRPoint origin;
  KRSize size;
  bool operator==(const KRRect&) const = default;
};
