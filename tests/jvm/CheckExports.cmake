# Fails unless every symbol LIBRARY defines for the dynamic linker (demangled)
# matches ALLOWED and one of them starts with EXPECTED. By default: JNI_OnLoad
# and nothing else.
# Run as: cmake -DNM=<nm> -DLIBRARY=<file> [-DALLOWED=<regex> -DEXPECTED=<name>] -P CheckExports.cmake
if(NOT DEFINED ALLOWED)
  set(ALLOWED "^JNI_OnLoad$")
  set(EXPECTED "JNI_OnLoad")
endif()
execute_process(COMMAND ${NM} -D -C --defined-only ${LIBRARY} OUTPUT_VARIABLE listing COMMAND_ERROR_IS_FATAL ANY)
string(REGEX REPLACE "(^|\n)[0-9a-fA-F]* *[A-Za-z] " "\\1" names "${listing}")
string(REGEX MATCHALL "[^\n]+" names "${names}")
list(FILTER names EXCLUDE REGEX "${ALLOWED}")
string(FIND "\n${listing}" " ${EXPECTED}" found)
if(names OR found EQUAL -1)
  list(JOIN names "\n  " names)
  message(FATAL_ERROR "${EXPECTED} must be exported, and nothing beyond '${ALLOWED}':\n  ${names}")
endif()
