# A code and its symbol name the same row; each row shows its own COM code, which for file
# errors is the bare Win32 number and not an HRESULT.
run_tool(error TE_FILE_NOT_FOUND EXIT 0 OUT by_symbol)
run_tool(error -17208 EXIT 0 OUT by_code)
expect_equal("${by_code}" "${by_symbol}" "error -17208 and error TE_FILE_NOT_FOUND")
expect_match("${by_code}"
             "^code +-17208\nsymbol +TE_FILE_NOT_FOUND\ncomCode +0x00000002\nmessage +[^\n]+\n$"
             "error -17208")

# "--" ends the options, so a negative code may also follow it.
run_tool(error -- -17000 EXIT 0 STDOUT "symbol +TE_OUT_OF_MEMORY\ncomCode +0x8007000E\n")
run_tool(error TE_INVALID_POINTER EXIT 0 STDOUT "^code +-17346\n.*comCode +0x80004003\n")
run_tool(error TE_INVALID_OR_OUT_OF_RANGE EXIT 0 STDOUT "comCode +0x80070057\n")
run_tool(error TE_OPERATION_TIMED_OUT EXIT 0 STDOUT "comCode +0x000005B4\n")
run_tool(error -18700 EXIT 0 STDOUT "symbol +TE_DNASSEMBLY_MISSING\ncomCode +0x80004005\n")
