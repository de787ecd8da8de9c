# tekit path: the path rules on command-line texts, as text and as JSON.
run_tool(path check "C:\\data\\report.ini" "C:settings.ini" EXIT 0
         STDOUT "^C:\\\\data\\\\report.ini: valid\nC:settings.ini: valid\n$")
run_tool(path check "C:\\a\\\\b" "\\x" EXIT 1
         STDOUT "^C:\\\\a\\\\\\\\b: Path contains two adjacent path separators \\(\\\\\\\\\\)\\.\n"
         STDERR "^tekit: 2 of 2 paths are not valid\n$")
run_tool(path check "C:\\d\\*.txt" EXIT 1)
run_tool(path check --wildcards "C:\\d\\*.txt" EXIT 0)
run_tool(path check --json "\\\\srv" EXIT 1 OUT json)
expect_json("${json}" "\\\\srv" 0 path)
expect_json("${json}" "OFF" 0 valid)
expect_json("${json}" "Path missing directory name after the network name." 0 message)

run_tool(path split --json "\\\\srv\\share\\dir\\report.final.ini" EXIT 0 OUT json)
expect_json("${json}" "\\\\srv\\share\\" root)
expect_json("${json}" "\\\\srv\\share\\dir" directory)
expect_json("${json}" "report.final.ini" fileName)
expect_json("${json}" "report.final" baseName)
expect_json("${json}" "ini" extension)
expect_json("${json}" "2" levels)
run_tool(path split "C:x" EXIT 0 STDOUT "^path +C:\\\\x\nroot +C:\\\\\n")
run_tool(path split "\\\\srv" EXIT 1 STDERR "has no levels")

run_tool(path collapse "C:\\a\\.\\b\\..\\c" EXIT 0 STDOUT "^C:\\\\a\\\\c\n$")
run_tool(path collapse --json "a\\..\\..\\b" EXIT 0 OUT json)
expect_json("${json}" "..\\b" collapsed)
expect_json("${json}" "OFF" resolved)

run_tool(path abbreviate --max 20 "C:\\first\\m1\\m2\\m3\\file.txt" EXIT 0
         STDOUT "^C:\\\\\\.\\.\\.\\\\file\\.txt\n$")
run_tool(path abbreviate --json --max 21 "C:\\first\\m1\\m2\\m3\\file.txt" EXIT 0 OUT json)
expect_json("${json}" "C:\\first\\...\\file.txt" abbreviated)
run_tool(path abbreviate "C:\\x" EXIT 2)

run_tool(path longpath "\\\\srv\\share\\f" EXIT 0 STDOUT "^\\\\\\\\\\?\\\\UNC\\\\srv\\\\share\\\\f\n$")
run_tool(path longpath --json "C:\\f" EXIT 0 OUT json)
expect_json("${json}" "\\\\?\\C:\\f" longPath)
run_tool(path EXIT 2)
