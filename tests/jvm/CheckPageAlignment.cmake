# Fails unless every LOAD segment of LIBRARY is aligned to 16 KB or more, as
# Android devices with 16 KB memory pages require of the libraries they load:
# its alignment, the last field of the line, has 4 hex digits from 0x4000 up.
# Run as: cmake -DREADELF=<readelf> -DLIBRARY=<file> -P CheckPageAlignment.cmake
execute_process(COMMAND ${READELF} -lW ${LIBRARY} OUTPUT_VARIABLE listing COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCH "\n *LOAD[^\n]+" segment "${listing}")
set(below "([0-9a-fA-F]?[0-9a-fA-F]?[0-9a-fA-F]|[0-3][0-9a-fA-F][0-9a-fA-F][0-9a-fA-F])")
string(REGEX MATCH "\n *LOAD[^\n]* 0x${below}\n" small "${listing}\n")
if(NOT segment OR small)
  message(FATAL_ERROR "every LOAD segment of ${LIBRARY} must be aligned to 16 KB or more:${small}")
endif()
