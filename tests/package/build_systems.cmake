# Builds the README's program with Meson and make from the installed library, and by hand from the sources.
include(${CMAKE_CURRENT_LIST_DIR}/common.cmake)
set(dir ${WORK_DIR}/build_systems)
file(REMOVE_RECURSE ${dir})
file(MAKE_DIRECTORY ${dir})
file(COPY_FILE ${README} ${dir}/readme.cpp)
set(ENV{CXX} ${CXX})
set(ENV{CXXFLAGS} "${CXX_FLAGS} -Wall -Wextra")
set(ENV{CMAKE_PREFIX_PATH} ${LIBDIR}/..)
set(ENV{PKG_CONFIG_PATH} ${LIBDIR}/pkgconfig)

function(in_dir)
  execute_process(COMMAND ${ARGV} WORKING_DIRECTORY ${dir} COMMAND_ERROR_IS_FATAL ANY)
endfunction()

file(WRITE ${dir}/meson.build "project('program', 'cpp', default_options: 'cpp_std=c++17')
executable('meson_by_pkg_config', 'readme.cpp', dependencies: dependency('mirel', method: 'pkg-config'))
executable('meson_by_cmake', 'readme.cpp', dependencies: dependency('mirel', method: 'cmake', modules: 'mirel::utils'))
")
in_dir(meson setup build)
in_dir(meson compile -C build)

file(WRITE ${dir}/Makefile "
build/make: readme.cpp
\t$(CXX) -std=c++17 $(CXXFLAGS) $< $$(pkg-config --cflags --libs mirel) -o $@
")
in_dir(make)

# As README.md says.
in_dir(sh -c "${CXX} -std=c++17 -O2 -DMIREL_KERNELS -I'${SOURCE_DIR}' readme.cpp '${SOURCE_DIR}'/utils/src/*.cpp -o build/hand")

foreach(program meson_by_pkg_config meson_by_cmake make hand)
  expect_readme(${dir}/build/${program})
endforeach()
