# Its own file: beside the targets, CMake includes every file whose name continues theirs, as the version file's would.
include(${CMAKE_CURRENT_LIST_DIR}/mirel-targets.cmake)
