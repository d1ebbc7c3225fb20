/// \file
/// A layout in writing.
#ifndef COMP_LAYOUT_TEXT_H
#define COMP_LAYOUT_TEXT_H

#include <nlohmann/json_fwd.hpp>
#include <string>

#include "Layout.h"

namespace comp {

/// A table for people.
std::string ToTable(const Layout& layout);

/// The same, for programs.
nlohmann::ordered_json ToJson(const Layout& layout);

}  // namespace comp

#endif  // COMP_LAYOUT_TEXT_H
