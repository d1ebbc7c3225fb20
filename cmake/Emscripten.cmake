# The toolchain for WebAssembly: that of the Emscripten that is installed, and what Debian's wants beside it.

execute_process(COMMAND em-config EMSCRIPTEN_ROOT
  OUTPUT_VARIABLE emscripten OUTPUT_STRIP_TRAILING_WHITESPACE COMMAND_ERROR_IS_FATAL ANY)
include(${emscripten}/cmake/Modules/Platform/Emscripten.cmake)

# Linking runs scripts that need acorn, which node does not look for where Debian has it.
set(CMAKE_CXX_LINKER_LAUNCHER ${CMAKE_COMMAND} -E env NODE_PATH=/usr/share/nodejs)

# Libraries that are headers only are taken from the machine that builds.
list(APPEND CMAKE_MODULE_PATH ${CMAKE_CURRENT_LIST_DIR}/emscripten)
