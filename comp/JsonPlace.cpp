#include "JsonPlace.h"

#include <algorithm>
#include <nlohmann/json.hpp>
#include <string_view>

namespace comp {
namespace {

using Json = nlohmann::json;

// Follows the parser along the path.
class Finder : public nlohmann::json_sax<Json> {
 public:
  Finder(const std::string& text, const std::vector<std::string>& path)
      : text_(text), path_(path), read_(text.data()) {}

  size_t Find() {
    const char* const end = text_.data() + text_.size();
    Json::sax_parse(Reading(text_.data(), &read_), Reading(end, &read_), this);
    return found_;
  }

  bool null() override { return Meet(); }
  bool boolean(bool) override { return Meet(); }
  bool number_integer(number_integer_t) override { return Meet(); }
  bool number_unsigned(number_unsigned_t) override { return Meet(); }
  bool number_float(number_float_t, const string_t&) override { return Meet(); }
  bool string(string_t&) override { return Meet(); }
  bool binary(binary_t&) override { return Meet(); }
  bool start_object(std::size_t) override { return Open(false); }
  bool end_object() override { return Close(); }
  bool start_array(std::size_t) override { return Open(true); }
  bool end_array() override { return Close(); }
  bool key(string_t& name) override {
    levels_.back().name = name;
    // Its opening quote, behind which the parser is by now.
    return Match(text_.rfind('"', Read() - 2));
  }
  bool parse_error(std::size_t, const std::string&, const Json::exception&) override {
    return false;
  }

 private:
  struct Level {
    bool isList;
    bool isOnPath;
    size_t count = 0;       // Elements met.
    std::string name = {};  // The last key.
  };

  size_t Read() const { return static_cast<size_t>(read_ - text_.data()); }

  // Notes the place of what is next on the path.
  bool Match(size_t byte) {
    const Level& level = levels_.back();
    const size_t depth = levels_.size();
    const std::string name = level.isList ? std::to_string(level.count - 1) : level.name;
    isNext_ = level.isOnPath && depth <= path_.size() && path_[depth - 1] == name;
    if (isNext_) found_ = byte;
    return true;
  }
  bool Meet() {
    if (!levels_.empty() && levels_.back().isList) {
      ++levels_.back().count;
      Match(Read() - 1);
    }
    return true;
  }
  bool Open(bool isList) {
    Meet();
    levels_.push_back({isList, levels_.empty() || isNext_});
    return true;
  }
  // What is on the path comes once.
  bool Close() {
    const bool isOnPath = levels_.back().isOnPath;
    levels_.pop_back();
    isNext_ = false;
    return !isOnPath;
  }

  const std::string& text_;
  const std::vector<std::string>& path_;
  const char* read_;
  std::vector<Level> levels_;
  bool isNext_ = false;
  size_t found_ = 0;
};

}  // namespace

Place PlaceOf(const std::string& text, size_t byte) {
  const std::string_view before = std::string_view(text).substr(0, byte);
  const auto lines = static_cast<size_t>(std::count(before.begin(), before.end(), '\n'));
  const std::string_view line = before.substr(lines == 0 ? 0 : before.rfind('\n') + 1);
  const auto isFirst = [](char c) { return (static_cast<unsigned char>(c) & 0xC0) != 0x80; };
  return {lines + 1, static_cast<size_t>(std::count_if(line.begin(), line.end(), isFirst)) + 1};
}

size_t FindPath(const std::string& text, const std::vector<std::string>& path) {
  return Finder(text, path).Find();
}

}  // namespace comp
