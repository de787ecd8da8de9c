# Runs the compressor's module-absent test in scratch copies of the streams test program:
# "absent" (no module), "renamed" (the module under another name) and "broken" (a file of the
# module's name that is no module). Arguments: PROGRAM, MODULE (the built module), SCRATCH (a
# directory of its own), EMULATOR (how to run a cross-built program; may be empty).
get_filename_component(program_name ${PROGRAM} NAME)
get_filename_component(program_dir ${PROGRAM} DIRECTORY)
get_filename_component(module_name ${MODULE} NAME)
foreach(mode absent renamed broken)
  set(dir ${SCRATCH}/${mode})
  file(REMOVE_RECURSE ${dir})
  file(MAKE_DIRECTORY ${dir}/modules)
  file(COPY ${PROGRAM} DESTINATION ${dir})
  if(program_name MATCHES "\\.exe$") # the runtime DLLs a Windows program needs beside it
    file(GLOB dlls ${program_dir}/*.dll)
    list(FILTER dlls EXCLUDE REGEX "/${module_name}$")
    file(COPY ${dlls} DESTINATION ${dir})
  endif()
  set(expect absent)
  if(mode STREQUAL "renamed")
    file(COPY_FILE ${MODULE} ${dir}/modules/${module_name}.off)
  elseif(mode STREQUAL "broken")
    file(WRITE ${dir}/modules/${module_name} "not a module\n")
    set(expect broken)
  endif()
  execute_process(COMMAND ${CMAKE_COMMAND} -E env TEKIT_TEST_COMPRESSION_MODULE=${expect}
                          ${EMULATOR} ${dir}/${program_name}
                          --gtest_filter=KaCompressorWithoutModule.* --gtest_brief=1
                  RESULT_VARIABLE status OUTPUT_VARIABLE out ERROR_VARIABLE err)
  # A skipped test exits 0 too: the mode must have reached the program.
  if(NOT status EQUAL 0 OR out MATCHES "SKIPPED" OR NOT out MATCHES "PASSED  \\] 1 test")
    message(FATAL_ERROR "module ${mode}: the test failed (${status})\n${out}\n${err}")
  endif()
endforeach()
