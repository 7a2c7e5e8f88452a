# Removes the static initializer that the resource compiler appends, so that
# registration happens only when the library's entry asks for it.
file(READ ${IN} content)
string(FIND "${content}" "namespace {\n   struct initializer" start)
if(start EQUAL -1)
  message(FATAL_ERROR "rcc output changed shape: no initializer found in ${IN}")
endif()
string(SUBSTRING "${content}" 0 ${start} content)
file(WRITE ${OUT} "${content}")
