#include "Text.h"

#include <algorithm>
#include <cstdio>
#include <iterator>

namespace comp {
namespace {

constexpr std::string_view kReplacement = "\xEF\xBF\xBD";

struct Character {
  char32_t code;
  std::string_view bytes;
};

// Takes the first character off a text that is not empty; U+FFFD for a byte that is no UTF-8.
Character Take(std::string_view* text) {
  const auto byte = [&](size_t i) { return static_cast<unsigned char>((*text)[i]); };
  const unsigned char first = byte(0);
  const size_t size = first < 0x80 ? 1 : first < 0xE0 ? 2 : first < 0xF0 ? 3 : 4;
  constexpr char32_t kLeast[] = {0, 0x80, 0x800, 0x10000};
  char32_t code = size == 1 ? first : first & (0x7Fu >> size);
  bool isValid = first < 0x80 || (first >= 0xC2 && first < 0xF5 && text->size() >= size);
  for (size_t i = 1; isValid && i < size; ++i) {
    isValid = (byte(i) & 0xC0) == 0x80;
    code = code << 6 | (byte(i) & 0x3F);
  }
  isValid &= code >= kLeast[size - 1] && code <= 0x10FFFF && (code < 0xD800 || code > 0xDFFF);
  Character taken = {isValid ? code : 0xFFFD, text->substr(0, isValid ? size : 1)};
  text->remove_prefix(taken.bytes.size());
  return taken;
}

struct Interval {
  char32_t first, last;
};

bool IsIn(char32_t code, const Interval* begin, const Interval* end) {
  return std::any_of(begin, end,
                     [&](const Interval& i) { return i.first <= code && code <= i.last; });
}

constexpr Interval kUnprintable[] = {{0, 0x1F},        {0x7F, 0x9F},     {0x200E, 0x200F},
                                     {0x2028, 0x202E}, {0x2066, 0x2069}, {0xFFFE, 0xFFFF}};
constexpr Interval kWide[] = {{0x1100, 0x115F}, {0x2E80, 0xA4CF},   {0xAC00, 0xD7A3},
                              {0xF900, 0xFAFF}, {0xFE30, 0xFE6F},   {0xFF00, 0xFF60},
                              {0xFFE0, 0xFFE6}, {0x1F300, 0x1FAFF}, {0x20000, 0x3FFFD}};
constexpr Interval kNarrow[] = {
    {0x300, 0x36F}, {0x200B, 0x200D}, {0x20D0, 0x20FF}, {0xFE00, 0xFE0F}};

size_t Columns(char32_t code) {
  if (code < 0x300) return 1;
  if (IsIn(code, std::begin(kNarrow), std::end(kNarrow))) return 0;
  return IsIn(code, std::begin(kWide), std::end(kWide)) ? 2 : 1;
}

}  // namespace

std::string Printable(std::string_view text) {
  std::string printable;
  printable.reserve(text.size());
  while (!text.empty()) {
    const Character c = Take(&text);
    if (IsIn(c.code, std::begin(kUnprintable), std::end(kUnprintable))) {
      printable += '?';
    } else {
      printable += c.code == 0xFFFD ? kReplacement : c.bytes;
    }
  }
  return printable;
}

std::string PrintableJson(std::string json) {
  // The first bytes of all that a writer of JSON leaves as it is.
  constexpr const char* kFirst = "\x7F\xC2\xE2";
  size_t at = json.find_first_of(kFirst);
  if (at == std::string::npos) return json;
  std::string printable;
  for (size_t from = 0;; at = json.find_first_of(kFirst, from)) {
    printable.append(json, from, at - from);
    if (at == std::string::npos) return printable;
    std::string_view rest = std::string_view(json).substr(at);
    const Character c = Take(&rest);
    if (IsIn(c.code, std::begin(kUnprintable), std::end(kUnprintable))) {
      char escaped[8];
      std::snprintf(escaped, sizeof escaped, "\\u%04x", static_cast<unsigned>(c.code));
      printable += escaped;
    } else {
      printable += c.bytes;
    }
    from = at + c.bytes.size();
  }
}

std::string Escaped(std::string_view text) {
  std::string escaped;
  for (const char c : Printable(text)) {
    switch (c) {
      case '&':
        escaped += "&amp;";
        break;
      case '<':
        escaped += "&lt;";
        break;
      case '>':
        escaped += "&gt;";
        break;
      default:
        escaped += c;
    }
  }
  return escaped;
}

size_t Columns(std::string_view text) {
  size_t columns = 0;
  while (!text.empty()) columns += Columns(Take(&text).code);
  return columns;
}

std::string Shortened(std::string_view text, size_t columns) {
  size_t used = 0, end = 0;
  for (std::string_view rest = text; !rest.empty();) {
    used += Columns(Take(&rest).code);
    if (used > columns) return std::string(text.substr(0, end)).append(columns > 0 ? "…" : "");
    if (used < columns) end = text.size() - rest.size();
  }
  return std::string(text);
}

double Width(std::string_view text) {
  double width = 0;
  while (!text.empty()) {
    const char32_t code = Take(&text).code;
    const bool isBroad =
        code == 'm' || code == 'w' || code == 'M' || code == 'W' || code == '@' || code == '%';
    const bool isSmall = (code >= 'a' && code <= 'z') || (code >= '0' && code <= '9') || code < 'A';
    width += Columns(code) == 0 ? 0 : Columns(code) == 2 || isBroad ? 1 : isSmall ? 0.64 : 0.8;
  }
  return width;
}

std::string Fitted(const std::string& text, double width) {
  if (Width(text) <= width) return text;
  size_t columns = 0;
  std::string fitted;
  for (std::string next = Shortened(text, 1); Width(next) <= width;
       next = Shortened(text, ++columns)) {
    fitted = next;
  }
  return columns < 3 ? "" : fitted;
}

std::string PadRight(std::string text, size_t columns) {
  const size_t used = Columns(text);
  if (used < columns) text.append(columns - used, ' ');
  return text;
}

std::string PadLeft(const std::string& text, size_t columns) {
  const size_t used = Columns(text);
  return std::string(used < columns ? columns - used : 1, ' ').append(text);
}

}  // namespace comp
