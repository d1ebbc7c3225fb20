# How M and its host are built as libraries.

# A library of the package: M::M or M::Host, in the tree as installed.
function(m_add_library name)
  string(REPLACE M_ "" exported ${name})
  add_library(${name} ${ARGN})
  add_library(M::${exported} ALIAS ${name})
  set_target_properties(${name} PROPERTIES EXPORT_NAME ${exported})
  target_compile_features(${name} PRIVATE cxx_std_20 INTERFACE cxx_std_17)
  set_target_properties(${name} PROPERTIES
    CXX_EXTENSIONS OFF
    CXX_VISIBILITY_PRESET hidden
    VISIBILITY_INLINES_HIDDEN ON
    POSITION_INDEPENDENT_CODE ON
    VERSION ${PROJECT_VERSION}
    SOVERSION ${PROJECT_VERSION_MAJOR})
  if(EMSCRIPTEN)
    # Without it nothing that is thrown is caught. All parts of a program have to agree.
    target_compile_options(${name} PUBLIC -fwasm-exceptions)
    target_link_options(${name} PUBLIC -fwasm-exceptions)
  endif()
  if(APPLE)
    # libM would be the system's libm on a disk that does not tell case.
    set_target_properties(${name} PROPERTIES PREFIX "" INSTALL_RPATH "@loader_path")
  else()
    set_target_properties(${name} PROPERTIES INSTALL_RPATH "$ORIGIN")
  endif()
endfunction()

# The headers of a library. They lie below `folder`, which is on the include path of everything that links the
# library, and keep their sub-folders.
function(m_library_headers name folder)
  target_sources(${name} PUBLIC FILE_SET HEADERS BASE_DIRS ${folder})
  foreach(header IN LISTS ARGN)
    target_sources(${name} PUBLIC FILE_SET HEADERS FILES ${folder}/${header})
  endforeach()
endfunction()

function(m_link_with_script name flag script)
  set(file ${CMAKE_CURRENT_SOURCE_DIR}/${script})
  target_link_options(${name} PRIVATE LINKER:${flag}${file})
  set_property(TARGET ${name} APPEND PROPERTY LINK_DEPENDS ${file})
endfunction()
