# What `cmake --install` puts in place: the public headers, libglimmer (the C++
# API) and the JNI library, a CMake package (find_package(Glimmer) gives
# Glimmer::glimmer and Glimmer::jni) and a pkg-config file (glimmer.pc).
include(CMakePackageConfigHelpers)

set(GLIMMER_CMAKE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/Glimmer)

install(TARGETS glimmer EXPORT GlimmerTargets
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
  FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
set_target_properties(GxEffect PROPERTIES EXPORT_NAME jni)
install(TARGETS GxEffect EXPORT GlimmerTargets
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(EXPORT GlimmerTargets NAMESPACE Glimmer:: DESTINATION ${GLIMMER_CMAKE_DIR})

configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/GlimmerConfig.cmake.in
  ${PROJECT_BINARY_DIR}/GlimmerConfig.cmake INSTALL_DESTINATION ${GLIMMER_CMAKE_DIR})
# Before 1.0 a minor release may change the API.
write_basic_package_version_file(${PROJECT_BINARY_DIR}/GlimmerConfigVersion.cmake
  COMPATIBILITY SameMinorVersion)
install(FILES ${PROJECT_BINARY_DIR}/GlimmerConfig.cmake ${PROJECT_BINARY_DIR}/GlimmerConfigVersion.cmake
  DESTINATION ${GLIMMER_CMAKE_DIR})

# The pkg-config file finds the prefix from its own place, so the install
# tree can be moved (or installed with --prefix) as a whole.
file(RELATIVE_PATH GLIMMER_PC_PREFIX /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
string(REGEX REPLACE "/$" "" GLIMMER_PC_PREFIX "${GLIMMER_PC_PREFIX}")
configure_file(${CMAKE_CURRENT_LIST_DIR}/glimmer.pc.in ${PROJECT_BINARY_DIR}/glimmer.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/glimmer.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
