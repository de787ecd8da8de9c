# Rebuilds the import library of a 32-bit DLL linked with --kill-at.
#
# --kill-at exports standard-call functions as "Foo" instead of "Foo@8", but the import library
# the linker writes alongside then names them "_Foo", while callers compiled against the headers
# look for "_Foo@8". The DLL is linked from a .def of plain names (cmake/Exports.cmake), so the
# linker's own .def output lists "Foo" alone; the decoration is read back from the DLL's symbol
# table, where "_Foo@8" still stands. dlltool -k turns "Foo@8" into an import library whose
# "_Foo@8" imports the plain name "Foo".
#
#   cmake -DDEF=<linker .def> -DDLLTOOL=<dlltool> -DNM=<nm> -DDLL=<path of the DLL>
#         -DDLL_NAME=tekit.dll -DIMPLIB=<lib.dll.a> -P MinGWImportLibrary.cmake
foreach(_var DEF DLLTOOL NM DLL DLL_NAME IMPLIB)
  if(NOT DEFINED ${_var})
    message(FATAL_ERROR "MinGWImportLibrary.cmake: ${_var} is not set")
  endif()
endforeach()

# "Foo" -> "Foo@8" for every standard-call function the DLL defines.
execute_process(COMMAND ${NM} --defined-only ${DLL} OUTPUT_VARIABLE _symbols
                RESULT_VARIABLE _result)
if(NOT _result EQUAL 0)
  message(FATAL_ERROR "${NM} failed (${_result}) reading ${DLL}")
endif()
string(REGEX MATCHALL "[ \t]_[A-Za-z_][A-Za-z0-9_]*@[0-9]+" _decorated "${_symbols}")

file(READ ${DEF} _def)
# An entry the linker wrote as "Foo = Foo@8" keeps only its decorated form.
string(REGEX REPLACE "([ \t])[^ \t\r\n=]+ = ([^ \t\r\n]+@[0-9]+)" "\\1\\2" _def "${_def}")
foreach(_symbol IN LISTS _decorated)
  string(REGEX REPLACE "^[ \t]_" "" _symbol "${_symbol}")
  string(REGEX REPLACE "@[0-9]+$" "" _name "${_symbol}")
  string(REGEX REPLACE "\n([ \t]+)${_name}([ \t]+@)" "\n\\1${_symbol}\\2" _def "${_def}")
endforeach()
set(_decorated_def ${DEF}.decorated)
file(WRITE ${_decorated_def} "${_def}")

execute_process(COMMAND ${DLLTOOL} -k -d ${_decorated_def} -D ${DLL_NAME} -l ${IMPLIB}
                RESULT_VARIABLE _result)
if(NOT _result EQUAL 0)
  message(FATAL_ERROR "dlltool failed (${_result}) writing ${IMPLIB}")
endif()
