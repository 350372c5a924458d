# Installs the library of one KIND, whole and by components, checks the files, and moves it.
include(${CMAKE_CURRENT_LIST_DIR}/common.cmake)
set(dir ${WORK_DIR}/${KIND})
file(REMOVE_RECURSE ${dir})

run(${CMAKE_COMMAND} -S ${SOURCE_DIR} -B ${dir}/build ${build_options} -DCMAKE_INSTALL_PREFIX=${dir}/prefix
  -DCMAKE_INSTALL_LIBDIR=${LIBDIR} -DMIREL_BUILD_TESTS=OFF -DMIREL_BUILD_EXAMPLES=OFF)
run(${CMAKE_COMMAND} --build ${dir}/build --parallel 2)
run(${CMAKE_COMMAND} --install ${dir}/build)
if(IS_ABSOLUTE ${LIBDIR})
  return() # the components' files would be at the same place
endif()

function(expect_files component) # FILE...
  run(${CMAKE_COMMAND} --install ${dir}/build --prefix ${dir}/${component} --component ${component})
  file(GLOB_RECURSE files RELATIVE ${dir}/${component} ${dir}/${component}/*)
  list(SORT files)
  list(SORT ARGN)
  if(NOT files STREQUAL ARGN)
    message(FATAL_ERROR "The ${component} component is\n  ${files}\ninstead of\n  ${ARGN}")
  endif()
endfunction()

file(GLOB headers RELATIVE ${SOURCE_DIR} ${SOURCE_DIR}/utils/*.h)
list(TRANSFORM headers PREPEND include/mirel/)
set(libraries ${LIBDIR}/libmirel_utils.a)
if(SHARED)
  set(libraries ${LIBDIR}/libmirel_utils.so)
  string(REGEX MATCH "^[0-9]+\\.[0-9]+" minor ${VERSION})
  set(versioned ${LIBDIR}/libmirel_utils.so.${minor} ${LIBDIR}/libmirel_utils.so.${VERSION})
endif()
expect_files(runtime ${versioned})
expect_files(development ${headers} include/mirel/utils/Version.h ${libraries} ${LIBDIR}/pkgconfig/mirel.pc
  ${LIBDIR}/cmake/mirel/mirel-config.cmake ${LIBDIR}/cmake/mirel/mirel-config-version.cmake
  ${LIBDIR}/cmake/mirel/mirel-targets.cmake ${LIBDIR}/cmake/mirel/mirel-targets-release.cmake
  share/gdb/python/gdb/printer/mirel_printers.py)

file(RENAME ${dir}/prefix ${dir}/moved)
