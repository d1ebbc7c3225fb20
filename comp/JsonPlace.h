/// \file
/// Where in a JSON text something stands.
#ifndef COMP_JSONPLACE_H
#define COMP_JSONPLACE_H

#include <cstddef>
#include <string>
#include <vector>

namespace comp {

/// Line and column, from 1.
struct Place {
  size_t line, column;
};

Place PlaceOf(const std::string& text, size_t byte);

/// The byte at which the value at a path begins, or the key before it: of as much of the path as is
/// there. Elements of a list count from 0. The text is JSON.
size_t FindPath(const std::string& text, const std::vector<std::string>& path);

}  // namespace comp

#endif  // COMP_JSONPLACE_H
