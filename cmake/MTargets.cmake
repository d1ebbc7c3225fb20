# How M and its host are built as libraries and installed as one package.

# A library of the package: M::NAME, in the tree as installed.
function(m_add_library name)
  add_library(${name} ${ARGN})
  add_library(M::${name} ALIAS ${name})
  target_compile_features(${name} PRIVATE cxx_std_20 INTERFACE cxx_std_17)
  set_target_properties(${name} PROPERTIES
    CXX_EXTENSIONS OFF
    CXX_VISIBILITY_PRESET hidden
    VISIBILITY_INLINES_HIDDEN ON
    POSITION_INDEPENDENT_CODE ON
    VERSION ${PROJECT_VERSION}
    SOVERSION ${PROJECT_VERSION_MAJOR})
  if(APPLE)
    # libM would be the system's libm on a disk that does not tell case.
    set_target_properties(${name} PROPERTIES PREFIX "" INSTALL_RPATH "@loader_path")
  else()
    set_target_properties(${name} PROPERTIES INSTALL_RPATH "$ORIGIN")
  endif()
endfunction()

# Installs a library with its headers. They lie below `folder`, which is on the include path of
# everything that links the library, and keep their sub-folders.
function(m_install_library name folder)
  target_sources(${name} PUBLIC FILE_SET HEADERS BASE_DIRS ${folder})
  foreach(header IN LISTS ARGN)
    target_sources(${name} PUBLIC FILE_SET HEADERS FILES ${folder}/${header})
  endforeach()
  install(TARGETS ${name} EXPORT MTargets
    LIBRARY COMPONENT runtime NAMELINK_COMPONENT development
    ARCHIVE COMPONENT development
    FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/M COMPONENT development)
endfunction()

function(m_link_with_script name flag script)
  set(file ${CMAKE_CURRENT_SOURCE_DIR}/${script})
  target_link_options(${name} PRIVATE LINKER:${flag}${file})
  set_property(TARGET ${name} APPEND PROPERTY LINK_DEPENDS ${file})
endfunction()

function(m_install_package)
  set(folder ${CMAKE_INSTALL_LIBDIR}/cmake/M)
  install(EXPORT MTargets NAMESPACE M:: DESTINATION ${folder} COMPONENT development)
  configure_package_config_file(cmake/MConfig.cmake.in ${PROJECT_BINARY_DIR}/MConfig.cmake
    INSTALL_DESTINATION ${folder} NO_SET_AND_CHECK_MACRO)
  write_basic_package_version_file(${PROJECT_BINARY_DIR}/MConfigVersion.cmake
    COMPATIBILITY SameMajorVersion)
  install(FILES ${PROJECT_BINARY_DIR}/MConfig.cmake ${PROJECT_BINARY_DIR}/MConfigVersion.cmake
    DESTINATION ${folder} COMPONENT development)

  set(pc_folder ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
  # Relative, so that an installed tree can be moved.
  file(RELATIVE_PATH pc_prefix /prefix/${pc_folder} /prefix)
  if(APPLE)
    # -lM would find the system's libm.
    set(pc_libs "\${libdir}/M${CMAKE_SHARED_LIBRARY_SUFFIX} \${libdir}/MHost${CMAKE_SHARED_LIBRARY_SUFFIX}")
  else()
    set(pc_libs "-L\${libdir} -lM -lMHost")
  endif()
  configure_file(cmake/M.pc.in ${PROJECT_BINARY_DIR}/M.pc @ONLY)
  install(FILES ${PROJECT_BINARY_DIR}/M.pc DESTINATION ${pc_folder} COMPONENT development)

  # gdb finds it by the library's place on the disk.
  if(BUILD_SHARED_LIBS AND NOT APPLE)
    install(FILES src/pkg/M/linux/libM-gdb.py
      DESTINATION ${CMAKE_INSTALL_DATADIR}/gdb/auto-load${CMAKE_INSTALL_FULL_LIBDIR}
      RENAME libM.so.${PROJECT_VERSION}-gdb.py COMPONENT runtime)
  endif()
endfunction()
