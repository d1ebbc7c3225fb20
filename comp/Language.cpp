#include "Language.h"

#include <libintl.h>

#include <filesystem>
#include <string_view>

namespace comp {
namespace {

constexpr char kDomain[] = "comp";

// The folder of the translations, by its place relative to the program: an installed tree can be
// moved.
bool BindCatalogues() {
  std::error_code error;
  const auto program = std::filesystem::canonical("/proc/self/exe", error);
  // A page is no file, and has its catalogues at the root.
  const auto folder = error ? "/share/locale" : program.parent_path() / COMP_RELATIVE_LOCALE_FOLDER;
  // C libraries that know no other codeset have null for this.
  bind_textdomain_codeset(kDomain, "UTF-8");
  return bindtextdomain(kDomain, folder.c_str()) != nullptr;
}

}  // namespace

const char* Tr(const char* english) {
  static const bool isBound = BindCatalogues();
  return isBound ? dgettext(kDomain, english) : english;
}

std::string Tr(const char* english, std::initializer_list<std::string> words) {
  std::string text;
  for (std::string_view rest = Tr(english); !rest.empty();) {
    const size_t place = rest.find('{');
    text.append(rest.substr(0, place));
    if (place == std::string_view::npos) break;
    rest.remove_prefix(place);
    const size_t word =
        rest.size() > 2 && rest[2] == '}' ? static_cast<size_t>(rest[1] - '0') : words.size();
    if (word < words.size()) {
      text += words.begin()[word];
      rest.remove_prefix(3);
    } else {
      text += '{';
      rest.remove_prefix(1);
    }
  }
  return text;
}

}  // namespace comp
