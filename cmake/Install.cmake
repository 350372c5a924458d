# Two components: what programs need to run (with a shared library), and what it takes to build them.
include(GNUInstallDirs)
include(CMakePackageConfigHelpers)

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/mirel)
install(TARGETS mirel_utils EXPORT mirel
  RUNTIME COMPONENT runtime
  LIBRARY COMPONENT runtime NAMELINK_COMPONENT development
  ARCHIVE COMPONENT development
  INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/mirel)
install(DIRECTORY utils ${PROJECT_BINARY_DIR}/include/utils DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/mirel
  COMPONENT development FILES_MATCHING PATTERN *.h PATTERN src EXCLUDE)
install(EXPORT mirel NAMESPACE mirel:: FILE mirel-targets.cmake DESTINATION ${package_dir} COMPONENT development)
write_basic_package_version_file(mirel-config-version.cmake COMPATIBILITY SameMinorVersion)
install(FILES cmake/mirel-config.cmake ${PROJECT_BINARY_DIR}/mirel-config-version.cmake
  DESTINATION ${package_dir} COMPONENT development)

# The prefix is relative to the file, so that the installed tree can be moved, unless the file's directory is absolute.
# Appending an absolute path to the prefix gives that path.
set(pc_dir ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
if(IS_ABSOLUTE ${pc_dir})
  set(pc_prefix ${CMAKE_INSTALL_PREFIX})
else()
  file(RELATIVE_PATH up /${pc_dir} /)
  string(REGEX REPLACE "/$" "" pc_prefix "\${pcfiledir}/${up}")
endif()
cmake_path(APPEND pc_libdir "\${prefix}" ${CMAKE_INSTALL_LIBDIR})
cmake_path(APPEND pc_includedir "\${prefix}" ${CMAKE_INSTALL_INCLUDEDIR} mirel)
# With a static library, a program that isn't linked by the C++ compiler must name the C++ runtime.
set(pc_runtime ${CMAKE_CXX_IMPLICIT_LINK_LIBRARIES})
list(FILTER pc_runtime INCLUDE REGEX "^(stdc\\+\\+|c\\+\\+|c\\+\\+abi|m)$")
list(REMOVE_DUPLICATES pc_runtime)
list(TRANSFORM pc_runtime PREPEND -l)
list(JOIN pc_runtime " " pc_runtime)
configure_file(cmake/mirel.pc.in mirel.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/mirel.pc DESTINATION ${pc_dir} COMPONENT development)

# GDB runs scripts in this folder of its data directory; docs/debugging.md describes it for users.
install(FILES tools/mirel_printers.py DESTINATION ${CMAKE_INSTALL_DATADIR}/gdb/python/gdb/printer
  COMPONENT development)
