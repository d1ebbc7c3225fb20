/// \file
/// Where in a JSON text something stands.
#ifndef COMP_JSONPLACE_H
#define COMP_JSONPLACE_H

#include <cstddef>
#include <iterator>
#include <string>
#include <vector>

namespace comp {

/// Line and column, from 1. Columns are characters.
struct Place {
  size_t line, column;
};

Place PlaceOf(const std::string& text, size_t byte);

/// Characters for the parser, which does not tell how far it is: `*read` does.
class Reading {
 public:
  using iterator_category = std::input_iterator_tag;
  using value_type = char;
  using difference_type = std::ptrdiff_t;
  using pointer = const char*;
  using reference = const char&;

  Reading(const char* at, const char** read) : at_(at), read_(read) {}
  reference operator*() const { return *at_; }
  Reading& operator++() {
    *read_ = ++at_;
    return *this;
  }
  bool operator==(const Reading& other) const { return at_ == other.at_; }
  bool operator!=(const Reading& other) const { return at_ != other.at_; }

 private:
  const char* at_;
  const char** read_;
};

/// The byte at which the value at a path begins, or the key before it: of as much of the path as is
/// there. Elements of a list count from 0. The text is JSON.
size_t FindPath(const std::string& text, const std::vector<std::string>& path);

}  // namespace comp

#endif  // COMP_JSONPLACE_H
