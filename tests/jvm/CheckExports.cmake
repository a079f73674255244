# Fails unless JNI_OnLoad is the only symbol LIBRARY defines for the dynamic
# linker. Run as: cmake -DNM=<nm> -DLIBRARY=<file> -P CheckExports.cmake
execute_process(COMMAND ${NM} -D --defined-only ${LIBRARY}
  OUTPUT_VARIABLE listing RESULT_VARIABLE status)
if(NOT status EQUAL 0)
  message(FATAL_ERROR "${NM} failed on ${LIBRARY}")
endif()
string(REGEX MATCHALL "[^\n]+" lines "${listing}")
set(names)
foreach(line IN LISTS lines)
  string(REGEX REPLACE "^.* " "" name "${line}")
  list(APPEND names ${name})
endforeach()
if(NOT names STREQUAL "JNI_OnLoad")
  message(FATAL_ERROR "exported: ${names}; expected JNI_OnLoad only")
endif()
message(STATUS "exported: ${names}")
