/// \file
/// A sheet in writing.
#ifndef COMP_SHEET_TEXT_H
#define COMP_SHEET_TEXT_H

#include <string>

#include "Sheet.h"

namespace comp {

/// A table for people.
std::string ToTable(const Sheet& sheet, bool mayDrop);

/// The same sheet as JSON, for programs.
std::string ToJson(const Sheet& sheet);

}  // namespace comp

#endif  // COMP_SHEET_TEXT_H
