# Checks that a Windows program needs no DLL beyond Windows' own: the C and
# C++ runtimes and the thread library are linked in. OBJDUMP lists the
# imports of PROGRAM.
execute_process(COMMAND ${OBJDUMP} -p ${PROGRAM} OUTPUT_VARIABLE dump RESULT_VARIABLE rc)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "${OBJDUMP} -p ${PROGRAM} failed")
endif()
string(REGEX MATCHALL "DLL Name: [^\r\n]+" imports "${dump}")
if(NOT imports)
  message(FATAL_ERROR "${PROGRAM} imports no DLL at all: not a Windows program?")
endif()
foreach(line ${imports})
  string(REPLACE "DLL Name: " "" dll "${line}")
  string(TOLOWER "${dll}" dll)
  if(NOT dll MATCHES "^(kernel32|user32|advapi32|shell32|rpcrt4|msvcrt|ws2_32|ole32)\\.dll$")
    message(FATAL_ERROR "${PROGRAM} needs ${dll}, which Windows doesn't have")
  endif()
  message(STATUS "imports ${dll}")
endforeach()
