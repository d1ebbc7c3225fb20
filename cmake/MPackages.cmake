# The Debian packages that cpack makes of an installation in /usr: see package.sh.

foreach(package libm-math1 libm-math-dev)
  set(component runtime)
  if(package MATCHES "dev$")
    set(component development)
  endif()
  set(folder ${CMAKE_INSTALL_DATADIR}/doc/${package})
  install(FILES src/pkg/M/linux/copyright DESTINATION ${folder} COMPONENT ${component} EXCLUDE_FROM_ALL)
  install(FILES ${PROJECT_BINARY_DIR}/changelog.gz DESTINATION ${folder} COMPONENT ${component} EXCLUDE_FROM_ALL)
endforeach()

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME libm-math)
set(CPACK_PACKAGE_CONTACT "The authors of M <m@math.example.org>")
set(CPACK_COMPONENTS_ALL runtime development)
set(CPACK_STRIP_FILES ON)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
# They need one another's libraries before any of them is installed.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${CMAKE_LIBRARY_OUTPUT_DIRECTORY})
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)

set(CPACK_DEBIAN_RUNTIME_PACKAGE_NAME libm-math1)
set(CPACK_DEBIAN_RUNTIME_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_RUNTIME_PACKAGE_CONTROL_EXTRA
  ${PROJECT_SOURCE_DIR}/src/pkg/M/linux/shlibs ${PROJECT_SOURCE_DIR}/src/pkg/M/linux/triggers)
# Below the project's description.
set(CPACK_DEBIAN_RUNTIME_DESCRIPTION
  "Exact rational time, fixed point, rectangles, matrices, rotations and the
geometry that carries layers to the screen, with the same bits on every
machine.")
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME libm-math-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS "libm-math1 (= ${PROJECT_VERSION})")
set(CPACK_DEBIAN_DEVELOPMENT_DESCRIPTION
  "Headers of the library and of its host, and what CMake and pkg-config need to
find them.")
include(CPack)
