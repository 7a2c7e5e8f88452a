# Compiles the host session example in the comment of a public header, as a
# host author would paste it: -DHEADER=<header> -DINCLUDE=<include folder>
# -DCOMPILER=<c++ compiler> -DOUTPUT=<scratch .cpp>.
file(STRINGS "${HEADER}" lines)
set(body "")
set(inside FALSE)
foreach(line IN LISTS lines)
  if(line MATCHES "^// Typical host session")
    set(inside TRUE)
  elseif(inside AND line MATCHES "^//   (.*)$")
    string(APPEND body "${CMAKE_MATCH_1}\n")
  elseif(inside AND NOT body STREQUAL "" AND line MATCHES "^//$")
    break()
  endif()
endforeach()
if(body STREQUAL "")
  message(FATAL_ERROR "no example found in ${HEADER}")
endif()
file(WRITE "${OUTPUT}" "#include \"zen/Zen.h\"\nvoid Example(void* ctx, zen::HostServices* s) {\n${body}}\n")
execute_process(COMMAND "${COMPILER}" -std=c++17 -fsyntax-only "-I${INCLUDE}" "${OUTPUT}"
                RESULT_VARIABLE result ERROR_VARIABLE errors)
if(NOT result EQUAL 0)
  message(FATAL_ERROR "the example in ${HEADER} does not compile:\n${errors}")
endif()
