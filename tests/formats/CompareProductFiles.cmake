# Runs the product_files example in a scratch directory and compares what it writes with the
# checked-in examples/files/, byte for byte (INI text ignoring its line ends, which are the
# platform's). Arguments: PROGRAM, EXPECTED (examples/files), SCRATCH (a directory of its own),
# EMULATOR (how to run a cross-built program; may be empty).
file(REMOVE_RECURSE ${SCRATCH})
file(MAKE_DIRECTORY ${SCRATCH})
execute_process(COMMAND ${EMULATOR} ${PROGRAM} .
                WORKING_DIRECTORY ${SCRATCH}
                RESULT_VARIABLE status OUTPUT_VARIABLE out ERROR_VARIABLE err)
if(NOT status EQUAL 0)
  message(FATAL_ERROR "product_files failed (${status}):\n${out}${err}")
endif()
file(GLOB expected RELATIVE ${EXPECTED} ${EXPECTED}/*)
file(GLOB written RELATIVE ${SCRATCH} ${SCRATCH}/*)
if(NOT expected STREQUAL written)
  message(FATAL_ERROR "product_files wrote ${written}; examples/files holds ${expected}")
endif()
foreach(name ${expected})
  set(options)
  if(name MATCHES "\\.ini$")
    set(options --ignore-eol)
  endif()
  execute_process(COMMAND ${CMAKE_COMMAND} -E compare_files ${options} ${EXPECTED}/${name}
                          ${SCRATCH}/${name}
                  RESULT_VARIABLE different)
  if(different)
    message(FATAL_ERROR "${name} differs from examples/files/${name}: regenerate with "
                        "\"product_files examples/files\" if the change is meant")
  endif()
endforeach()
message(STATUS "${expected}: as checked in")
