// Messages in the user's language, from gettext's catalogues.

#include <dlfcn.h>
#include <libintl.h>

#include <cstdint>
#include <cstring>
#include <filesystem>
#include <mutex>
#include <string>
#include <string_view>

#include "U.h"
#include "U_Limits.h"

namespace {

// The layout in which a component hands over its messages.
struct Entry {
  const char* key;
  alignas(8) uint64_t cache[3];
};
struct Header {
  const char* component;
  alignas(8) uint64_t count;  // with the terminator
  const Entry* table;
  alignas(8) uint64_t reserved;
};

std::mutex folderMutex;

// The strings here are never destroyed: reports may still come while the program ends.

// Empty: the folder beside the library.
std::string& ChosenFolder() {
  static std::string& folder = *new std::string;
  return folder;
}

// The file that holds this code: the library or, where that is static, the program.
std::filesystem::path OwnFile() {
#ifdef U_IS_STATIC
  return "/proc/self/exe";
#else
  Dl_info info;
  const bool isKnown = dladdr(reinterpret_cast<const void*>(&OwnFile), &info) != 0;
  return isKnown ? info.dli_fname : "";
#endif
}

// The folder of the translations. It is found by its place relative to this code, so that an
// installed tree can be moved.
const std::string& OwnFolder() {
  static const std::string& folder = *[] {
    std::error_code error;
    const auto file = std::filesystem::canonical(OwnFile(), error);
    return error ? new std::string : new std::string(file.parent_path() / U_RELATIVE_LOCALE_FOLDER);
  }();
  return folder;
}

// The path may be relative to the folder in which the program starts, which it may leave.
[[maybe_unused]] const std::string& folderFoundAtStart = OwnFolder();

void BindCatalogue(const char* component) {
  const std::lock_guard lock(folderMutex);
  const std::string& folder = ChosenFolder().empty() ? OwnFolder() : ChosenFolder();
  if (folder.empty()) return;
  const char* const bound = bindtextdomain(component, nullptr);
  if (!bound || folder != bound) bindtextdomain(component, folder.c_str());
}

// The next placeholder of a format: from a '%' up to its conversion letter. Moves `text` behind it;
// empty at the end.
std::string_view NextPlaceholder(const char** text) {
  const char* const start = std::strchr(*text, '%');
  if (!start) return {};
  const char* end = start + 1 + std::strcspn(start + 1, "%diouxXeEfFgGaAcCsSpnm");
  if (*end) ++end;
  *text = end;
  return {start, static_cast<size_t>(end - start)};
}

bool HaveSamePlaceholders(const char* a, const char* b) {
  std::string_view found;
  do {
    found = NextPlaceholder(&a);
    if (found != NextPlaceholder(&b)) return false;
  } while (!found.empty());
  return true;
}

}  // namespace

extern "C" {

const char* U_ZLookupLStrCache(const void* header, int32_t index, int32_t, int32_t) {
  const auto* const strings = static_cast<const Header*>(header);
  if (index < 0 || static_cast<uint64_t>(index) >= strings->count) return "";
  const char* const key = strings->table[index].key;
  const char* const separator = key ? std::strchr(key, '=') : nullptr;
  if (!separator) return "";
  const char* const english = separator + 1;
  if (std::strlen(english) >= U_TEXT_BYTES || *english == '\0') return "";
  BindCatalogue(strings->component);
  const char* const translation = dgettext(strings->component, english);
  // A catalogue comes from outside: a text that could make a report read arguments it was not
  // given, or run over the buffer, is left alone.
  const bool isUsable =
      std::strlen(translation) < U_TEXT_BYTES && HaveSamePlaceholders(translation, english);
  return isUsable ? translation : english;
}

void U_SetMessageFolder(const char* folder) {
  const std::lock_guard lock(folderMutex);
  ChosenFolder() = folder ? folder : "";
}

}  // extern "C"
