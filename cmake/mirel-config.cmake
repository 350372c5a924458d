# In a file of its own: mirel-targets.cmake includes every file whose name continues its own, as the version file's would.
include(${CMAKE_CURRENT_LIST_DIR}/mirel-targets.cmake)
