# Fails unless every LOAD segment of LIBRARY is aligned to 16 KB or more, as
# Android devices with 16 KB memory pages require of the libraries they load.
# Run as: cmake -DREADELF=<readelf> -DLIBRARY=<file> -P CheckPageAlignment.cmake
execute_process(COMMAND ${READELF} -lW ${LIBRARY} OUTPUT_VARIABLE listing COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCHALL "\n *LOAD[^\n]+" segments "${listing}")
if(NOT segments)
  message(FATAL_ERROR "no LOAD segment in ${LIBRARY}")
endif()
foreach(segment IN LISTS segments)
  string(REGEX MATCH "0x[0-9a-fA-F]+$" align "${segment}")
  math(EXPR align "${align}")
  if(align LESS 16384)
    message(FATAL_ERROR "a LOAD segment aligned to ${align} bytes:${segment}")
  endif()
endforeach()
