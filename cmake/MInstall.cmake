# M and its host, installed as one package that CMake and pkg-config find.

install(TARGETS M M_Host EXPORT MTargets
  LIBRARY COMPONENT runtime NAMELINK_COMPONENT development
  ARCHIVE COMPONENT development
  FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/M COMPONENT development)

set(folder ${CMAKE_INSTALL_LIBDIR}/cmake/M)
install(EXPORT MTargets NAMESPACE M:: DESTINATION ${folder} COMPONENT development)
configure_package_config_file(cmake/MConfig.cmake.in ${PROJECT_BINARY_DIR}/MConfig.cmake
  INSTALL_DESTINATION ${folder} NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/MConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/MConfig.cmake ${PROJECT_BINARY_DIR}/MConfigVersion.cmake
  DESTINATION ${folder} COMPONENT development)

set(folder ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
# Relative, so that an installed tree can be moved.
file(RELATIVE_PATH pc_prefix /prefix/${folder} /prefix)
if(APPLE)
  # -lM would find the system's libm.
  set(pc_libs "\${libdir}/M${CMAKE_SHARED_LIBRARY_SUFFIX} \${libdir}/MHost${CMAKE_SHARED_LIBRARY_SUFFIX}")
else()
  set(pc_libs "-L\${libdir} -lM -lMHost")
endif()
configure_file(cmake/M.pc.in ${PROJECT_BINARY_DIR}/M.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/M.pc DESTINATION ${folder} COMPONENT development)

# gdb finds it by the library's place on the disk.
if(BUILD_SHARED_LIBS AND NOT APPLE)
  install(FILES src/pkg/M/linux/libM-gdb.py
    DESTINATION ${CMAKE_INSTALL_DATADIR}/gdb/auto-load${CMAKE_INSTALL_FULL_LIBDIR}
    RENAME libM.so.${PROJECT_VERSION}-gdb.py COMPONENT runtime)
endif()
