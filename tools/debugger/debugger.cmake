# How a debugger finds the script that shows strings as text; docs/debugging.md tells users what comes of it.
block() # leaves no variables behind
set(script ${CMAKE_CURRENT_LIST_DIR}/mirel_printers.py)
set(script_dir gdb/auto-load/mirel)
if(MIREL_INSTALL)
  install(FILES ${script} DESTINATION ${CMAKE_INSTALL_DATADIR}/${script_dir} COMPONENT development)
endif()
get_target_property(type mirel_utils TYPE)

# For a shared library GDB looks of its own accord, by the library's real path, which is known when it is installed.
if(MIREL_INSTALL AND type STREQUAL SHARED_LIBRARY)
  set(libdir ${CMAKE_INSTALL_LIBDIR})
  if(NOT IS_ABSOLUTE "${libdir}")
    set(libdir "\${CMAKE_INSTALL_PREFIX}/${libdir}")
  endif()
  install(CODE "file(REAL_PATH \"${libdir}\" mirel_libdir)" COMPONENT development)
  install(FILES ${script} DESTINATION "${CMAKE_INSTALL_DATADIR}/gdb/auto-load\${mirel_libdir}"
    RENAME $<TARGET_FILE_NAME:mirel_utils>-gdb.py COMPONENT development)
endif()

# The static library leaves a note with the script's path in the program, so that the path has to be known now: it
# is where the script will be installed, or else where it is. MIREL_GDB_SCRIPT names another, or nothing for no note.
if(type STREQUAL STATIC_LIBRARY AND CMAKE_EXECUTABLE_FORMAT STREQUAL ELF)
  if(NOT DEFINED MIREL_GDB_SCRIPT AND MIREL_INSTALL)
    set(MIREL_GDB_SCRIPT ${CMAKE_INSTALL_FULL_DATADIR}/${script_dir}/mirel_printers.py)
    install(CODE "if(NOT CMAKE_INSTALL_PREFIX STREQUAL \"${CMAKE_INSTALL_PREFIX}\")
      message(NOTICE \"Programs linked to the static library tell GDB to look for ${MIREL_GDB_SCRIPT}: \"
        \"configure with the prefix that is installed to.\")
    endif()" COMPONENT development)
  elseif(NOT DEFINED MIREL_GDB_SCRIPT)
    set(MIREL_GDB_SCRIPT ${script})
  endif()
  if(MIREL_GDB_SCRIPT)
    set_property(SOURCE ${PROJECT_SOURCE_DIR}/utils/src/VectorOfByte.cpp TARGET_DIRECTORY mirel_utils
      APPEND PROPERTY COMPILE_DEFINITIONS MIREL_GDB_SCRIPT="${MIREL_GDB_SCRIPT}")
  endif()
endif()
endblock()
