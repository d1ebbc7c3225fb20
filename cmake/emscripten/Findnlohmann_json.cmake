# The headers of the machine that builds, without the others that lie beside them.

find_path(nlohmann_json_FOLDER nlohmann/json.hpp PATHS /usr/include NO_CMAKE_FIND_ROOT_PATH)
include(FindPackageHandleStandardArgs)
find_package_handle_standard_args(nlohmann_json REQUIRED_VARS nlohmann_json_FOLDER)
if(nlohmann_json_FOUND AND NOT TARGET nlohmann_json::nlohmann_json)
  set(folder ${CMAKE_BINARY_DIR}/headers)
  file(MAKE_DIRECTORY ${folder})
  file(CREATE_LINK ${nlohmann_json_FOLDER}/nlohmann ${folder}/nlohmann SYMBOLIC)
  add_library(nlohmann_json::nlohmann_json INTERFACE IMPORTED)
  target_include_directories(nlohmann_json::nlohmann_json INTERFACE ${folder})
endif()
