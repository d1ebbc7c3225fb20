/// \file
/// Text of UTF-8 as terminals and pictures hold it.
#ifndef COMP_TEXT_H
#define COMP_TEXT_H

#include <cstddef>
#include <string>
#include <string_view>

namespace comp {

/// A text without what no terminal or XML should see: control characters and those that change the
/// direction of writing become '?', what is no UTF-8 becomes U+FFFD.
std::string Printable(std::string_view text);

/// The same, with what XML writes otherwise.
std::string Escaped(std::string_view text);

/// JSON in which what no terminal should see is escaped.
std::string PrintableJson(std::string json);

/// The columns that a text takes in a terminal: two for an ideograph or a kana, none for an accent.
size_t Columns(std::string_view text);

/// The text or, with dots, as much of it as there is room for.
std::string Shortened(std::string_view text, size_t columns);

/// The width of a text in a proportional font by its height: rather too much than too little.
double Width(std::string_view text);

/// The text or, with dots, as much of it as so much width holds; nothing if that is too little.
std::string Fitted(const std::string& text, double width);

/// Padded on the right to so many columns.
std::string PadRight(std::string text, size_t columns);

/// Padded on the left to so many columns, with one blank at least.
std::string PadLeft(const std::string& text, size_t columns);

}  // namespace comp

#endif  // COMP_TEXT_H
