# Compares the names that the shared library exports with the list.
set(expected ${SOURCE_DIR}/utils/exports.txt)
set(actual ${WORK_DIR}/exports.txt)
set(library ${WORK_DIR}/shared/build/libmirel_utils.so)
# Some linkers add symbols of their own. The compiler chooses which instances of a vector's member templates exist, and
# programs make their own.
execute_process(COMMAND sh -c "'${NM}' -DC --defined-only '${library}' | cut -d' ' -f3- |
    grep -vx -e __bss_start -e _edata -e _end -e '[a-z ]* mirel::xvector<.*>::[a-z_]*<.*' | LC_ALL=C sort -u"
  OUTPUT_FILE ${actual} COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND diff -u ${expected} ${actual} RESULT_VARIABLE differs)
if(differs)
  message(FATAL_ERROR "The shared library exports other names than utils/exports.txt lists. If that is intended, run\n"
    "  cp ${actual} ${expected}")
endif()
