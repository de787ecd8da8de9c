# --all lists all 158 rows in the table's order, as text under a heading or as a JSON array.
run_tool(error --all EXIT 0 OUT table)
expect_match("${table}" "^CODE +COM CODE +SYMBOL +MESSAGE\n-17000 +0x8007000E +TE_OUT_OF_MEMORY +"
             "first rows of error --all")
expect_match("${table}" "\n-18700 +0x80004005 +TE_DNASSEMBLY_MISSING +[^\n]+\n$"
             "last row of error --all")
string(REGEX MATCHALL "\n-1[78][0-9][0-9][0-9] " rows "${table}")
list(LENGTH rows count)
expect_equal("${count}" 158 "rows of error --all")

run_tool(--json error --all EXIT 0 OUT json)
json_length(count "${json}")
expect_equal("${count}" 158 "elements of --json error --all")
expect_json("${json}" TE_OUT_OF_MEMORY 0 symbol)
expect_json("${json}" -17001 1 code)
expect_json("${json}" TE_DNASSEMBLY_MISSING 157 symbol)
# Codes descend through the table: a row out of place shows here.
set(previous 0)
math(EXPR last "${count} - 1")
foreach(index RANGE ${last})
  string(JSON code GET "${json}" ${index} code)
  if(NOT code LESS previous)
    message(SEND_ERROR "row ${index}: code ${code} does not descend from ${previous}")
  endif()
  set(previous ${code})
endforeach()
