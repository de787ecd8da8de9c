# Rebuilds the import library of a 32-bit DLL linked with --kill-at.
#
# --kill-at exports standard-call functions as "Foo" instead of "Foo@8", but the import library
# the linker writes alongside then names them "_Foo", while callers compiled against the headers
# look for "_Foo@8". The linker's own .def output keeps both ("Foo = Foo@8"); dlltool -k turns
# its decorated form into an import library whose "_Foo@8" imports the plain name "Foo".
#
#   cmake -DDEF=<linker .def> -DDLLTOOL=<dlltool> -DDLL_NAME=tekit.dll -DIMPLIB=<lib.dll.a>
#         -P MinGWImportLibrary.cmake
foreach(_var DEF DLLTOOL DLL_NAME IMPLIB)
  if(NOT DEFINED ${_var})
    message(FATAL_ERROR "MinGWImportLibrary.cmake: ${_var} is not set")
  endif()
endforeach()

file(READ ${DEF} _def)
# "    Foo = Foo@8 @2" becomes "    Foo@8 @2"; undecorated entries stay as they are.
string(REGEX REPLACE "([ \t])[^ \t\r\n=]+ = ([^ \t\r\n]+@[0-9]+)" "\\1\\2" _def "${_def}")
set(_decorated ${DEF}.decorated)
file(WRITE ${_decorated} "${_def}")

execute_process(COMMAND ${DLLTOOL} -k -d ${_decorated} -D ${DLL_NAME} -l ${IMPLIB}
                RESULT_VARIABLE _result)
if(NOT _result EQUAL 0)
  message(FATAL_ERROR "dlltool failed (${_result}) writing ${IMPLIB}")
endif()
