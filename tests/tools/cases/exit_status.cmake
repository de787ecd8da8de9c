# A failed command exits 1 with "tekit: ..." on stderr and nothing on stdout; a wrong command
# line exits 2 with CLI11's message on stderr.
run_tool(error -1 EXIT 1 STDOUT "^$" STDERR "^tekit: -1 is not a TEError code\n$")
run_tool(error 0 EXIT 1 STDOUT "^$" STDERR "^tekit: 0 is not a TEError code\n$")
run_tool(error TE_NO_SUCH_ERROR EXIT 1 STDOUT "^$"
         STDERR "^tekit: unknown error symbol \"TE_NO_SUCH_ERROR\"\n$")
# Symbols are spelled exactly.
run_tool(error te_file_not_found EXIT 1 STDOUT "^$" STDERR "unknown error symbol")
# Beyond 32 bits a number is no code either.
run_tool(error -4294984504 EXIT 1 STDOUT "^$" STDERR "^tekit: -4294984504 is not a TEError code\n$")

foreach(arguments "" "nosuchcommand" "error" "error;--bogus" "error;-17208;--all"
                  "error;TE_DISK_FULL;--all" "error;-17208;-17209" "demo;extra" "--json")
  run_tool(${arguments} EXIT 2 STDOUT "^$" STDERR ".")
endforeach()
