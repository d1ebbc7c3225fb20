/// \file
/// A scene in writing.
#ifndef COMP_SCENE_TEXT_H
#define COMP_SCENE_TEXT_H

#include <nlohmann/json_fwd.hpp>
#include <string>

#include "Scene.h"

namespace comp {

/// A table for people.
std::string ToTable(const Scene& scene);

/// The same, for programs.
nlohmann::ordered_json ToJson(const Scene& scene);

}  // namespace comp

#endif  // COMP_SCENE_TEXT_H
