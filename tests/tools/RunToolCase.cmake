# Runs one case script against the tekit program:
#
#   cmake -DTOOL_ENVIRONMENT=<ToolEnvironment.cmake> -DCASE=<cases/x.cmake> -P RunToolCase.cmake
#
# A case calls run_tool() and the expect_*() checks below. A failed check is reported and the
# case goes on, so one run shows every failure; the script then exits non-zero.
include(${TOOL_ENVIRONMENT})

# run_tool(<arguments>... EXIT <status> [STDOUT <regex>] [STDERR <regex>] [OUT <var>])
# Windows line ends are made "\n" before matching, so the same regexes serve every platform.
function(run_tool)
  cmake_parse_arguments(PARSE_ARGV 0 RUN "" "EXIT;STDOUT;STDERR;OUT" "")
  execute_process(COMMAND ${EMULATOR} ${TOOL} ${RUN_UNPARSED_ARGUMENTS}
                  RESULT_VARIABLE status OUTPUT_VARIABLE out ERROR_VARIABLE err)
  string(REPLACE "\r\n" "\n" out "${out}")
  string(REPLACE "\r\n" "\n" err "${err}")
  list(JOIN RUN_UNPARSED_ARGUMENTS " " shown)
  set(report "\n--- stdout:\n${out}--- stderr:\n${err}---")
  if(NOT "${status}" STREQUAL "${RUN_EXIT}")
    message(SEND_ERROR "tekit ${shown}: exit status ${status}, expected ${RUN_EXIT}${report}")
  endif()
  if(DEFINED RUN_STDOUT AND NOT out MATCHES "${RUN_STDOUT}")
    message(SEND_ERROR "tekit ${shown}: stdout does not match [${RUN_STDOUT}]${report}")
  endif()
  if(DEFINED RUN_STDERR AND NOT err MATCHES "${RUN_STDERR}")
    message(SEND_ERROR "tekit ${shown}: stderr does not match [${RUN_STDERR}]${report}")
  endif()
  if(RUN_OUT)
    set(${RUN_OUT} "${out}" PARENT_SCOPE)
  endif()
endfunction()

# expect_match(<text> <regex> <what>)
function(expect_match text regex what)
  if(NOT text MATCHES "${regex}")
    message(SEND_ERROR "${what}: does not match [${regex}] in:\n${text}")
  endif()
endfunction()

# expect_equal(<actual> <expected> <what>)
function(expect_equal actual expected what)
  if(NOT "${actual}" STREQUAL "${expected}")
    message(SEND_ERROR "${what}: got [${actual}], expected [${expected}]")
  endif()
endfunction()

# expect_json(<json> <expected> <path>...): the value at the path, which must exist.
function(expect_json json expected)
  string(JSON value ERROR_VARIABLE error GET "${json}" ${ARGN})
  if(error)
    message(SEND_ERROR "JSON ${ARGN}: ${error}")
  else()
    expect_equal("${value}" "${expected}" "JSON ${ARGN}")
  endif()
endfunction()

# json_length(<var> <json> <path>...): element count, or -1 when the JSON is not valid.
function(json_length var json)
  string(JSON length ERROR_VARIABLE error LENGTH "${json}" ${ARGN})
  if(error)
    message(SEND_ERROR "JSON length of [${ARGN}]: ${error}")
    set(length -1)
  endif()
  set(${var} ${length} PARENT_SCOPE)
endfunction()

# regex_escape(<var> <text>): `text` as a regex that matches only itself.
function(regex_escape var text)
  string(REGEX REPLACE "([][.*+?^$()|\\\\{}])" "\\\\\\1" escaped "${text}")
  set(${var} "${escaped}" PARENT_SCOPE)
endfunction()

include(${CASE})
