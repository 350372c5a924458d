function(run)
  execute_process(COMMAND ${ARGV} COMMAND_ERROR_IS_FATAL ANY)
endfunction()

function(expect_readme program)
  execute_process(COMMAND ${program} OUTPUT_VARIABLE output COMMAND_ERROR_IS_FATAL ANY)
  if(NOT output STREQUAL "Grüße!! 世界 has 10 units\n")
    message(FATAL_ERROR "The program of the README, as ${program}, printed: ${output}")
  endif()
endfunction()

set(build_options -G Ninja -DCMAKE_BUILD_TYPE=Release -DCMAKE_CXX_COMPILER=${CXX} -DCMAKE_CXX_FLAGS=${CXX_FLAGS}
  -DBUILD_SHARED_LIBS=${SHARED} -DCMAKE_COMPILE_WARNING_AS_ERROR=ON)
