# demo shows the library at work; each result it prints is computed, so a fault in sharing,
# truncation, multibyte handling or raising shows up here.
run_tool(demo EXIT 0 STDERR "^$" OUT text)
foreach(expected
    "DynamicString b = a +one block, 2 references, same bytes: yes\n"
    "a = \"Numeric Limit Test\" \\(1 reference\\), b = \"Numeric Limit Test #2\" \\(1 reference\\)"
    "uses the shared empty block: yes\n"
    "StaticString<64> = a 108-character text +keeps 64: \"Measure the supply voltage Measure"
    "keeps 15: \"0123456789ABCDE\"\n"
    "10 bytes, 8 characters\n"
    "Reverse\\(\\) +96 7B 93 FA 20 6E 6F 68 69 4E "
    "keeps 63 bytes"
    "TE_RAISE\\(TE_FILE_NOT_FOUND, \\.\\.\\.\\) +-17208 TE_FILE_NOT_FOUND\n"
    "GetDescription\\(\\) +\"Could not open \"station.ini\".\"\n"
    "GetFunctionName\\(\\) +DemoCommand::RaiseAndCatch\n"
    "GetFileName\\(\\), GetLine\\(\\) +DemoCommand, line [1-9][0-9]*\n"
    "TEErrorToRString\\(-1\\) +\"[^\"\n]+\", found: no\n"
    "GetWinErrorCode\\(TE_FILE_NOT_FOUND\\) +0x00000002\n"
    "GetWinErrorCode\\(TE_ACCESS_DENIED\\) +0x80070005\n"
    "IsValid\\(C:settings.ini\\) +valid \\(stored as \"C:\\\\settings.ini\"\\)\n"
    "IsValid\\(C:\\\\data\\\\\\\\report.txt\\) +Path contains two adjacent path separators"
    "GetAbbreviatedName\\(40\\) +\"C:\\\\TestStations\\\\\\.\\.\\.\\\\voltage.final.csv\"\n")
  expect_match("${text}" "${expected}" "tekit demo")
endforeach()

run_tool(demo --json EXIT 0 OUT json)
json_length(sections "${json}")
expect_equal("${sections}" 6 "sections of demo --json")
expect_json("${json}" "Strings: copy-on-write sharing" 0 title)
expect_json("${json}" "DynamicString b = a" 0 steps 1 action)
