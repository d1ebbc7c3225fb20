/// \file
/// What the program says, in the user's language.
#ifndef COMP_LANGUAGE_H
#define COMP_LANGUAGE_H

#include <initializer_list>
#include <string>

namespace comp {

/// The translation of an English text of this program, as UTF-8; the text itself where there is
/// none.
const char* Tr(const char* english);

/// Marks an English text that is translated where it is used.
constexpr const char* Later(const char* english) { return english; }

/// The translation, with each {0}, {1} … replaced by one of the words.
std::string Tr(const char* english, std::initializer_list<std::string> words);

}  // namespace comp

#endif  // COMP_LANGUAGE_H
