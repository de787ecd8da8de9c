# --version prints exactly "tekit <version>"; --help succeeds and lists every command.
regex_escape(version "${VERSION}")
run_tool(--version EXIT 0 STDOUT "^tekit ${version}\n$" STDERR "^$")
run_tool(--help EXIT 0 OUT help)
foreach(command demo error)
  expect_match("${help}" "\n +${command} " "tekit --help lists ${command}")
endforeach()
run_tool(error --help EXIT 0 STDOUT "--all" STDERR "^$")
