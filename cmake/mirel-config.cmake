# The exported targets are in a file of their own: it includes all mirel-targets-*.cmake. Here that would be
# mirel-config-*.cmake, and so mirel-config-version.cmake.
include(${CMAKE_CURRENT_LIST_DIR}/mirel-targets.cmake)
