# Installs the build into a scratch prefix, then builds and runs the README's
# C++ example (its first ```cpp block) against that install twice: through
# find_package(Glimmer) and through pkg-config. Also runs the installed
# renderer, which finds the library through its relative run path.
# Arguments: -DBUILD_DIR= -DWORK= -DREADME= -DCONSUMER= -DCXX= -DGENERATOR=
# [-DCXX_FLAGS=] [-DTOOLCHAIN=] [-DEMULATOR=] [-DRENDERER=ON]

cmake_minimum_required(VERSION 3.25)

function(run what)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE status OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT status EQUAL 0)
    message(FATAL_ERROR "${what} failed (${status}):\n${out}\n${err}")
  endif()
  set(out "${out}" PARENT_SCOPE)
endfunction()

# Sanitizer builds: the consumers link the same runtime; the library's own
# leak checks run elsewhere, without fontconfig's one-time allocations.
set(run_env ${CMAKE_COMMAND} -E env ASAN_OPTIONS=detect_leaks=0)

file(REMOVE_RECURSE "${WORK}")
set(prefix "${WORK}/prefix")
run("cmake --install" ${CMAKE_COMMAND} --install "${BUILD_DIR}" --prefix "${prefix}")

# The example, exactly as the README shows it.
file(READ "${README}" readme)
string(REGEX MATCH "```cpp\n(.*)" rest "${readme}")
string(FIND "${CMAKE_MATCH_1}" "```" end)
if(end LESS 0)
  message(FATAL_ERROR "no ```cpp block in ${README}")
endif()
string(SUBSTRING "${CMAKE_MATCH_1}" 0 ${end} example)
file(WRITE "${WORK}/example.cpp" "${example}")

# The example prints the picture's size and margins.
set(expected "^rendered [0-9]+x[0-9]+, margins [0-9]+ [0-9]+ [0-9]+ [0-9]+\n$")

# 1. CMake package.
set(configure ${CMAKE_COMMAND} -S "${CONSUMER}" -B "${WORK}/cmake-build" -G "${GENERATOR}"
    "-DCMAKE_PREFIX_PATH=${prefix}" "-DEXAMPLE=${WORK}/example.cpp" "-DCMAKE_CXX_COMPILER=${CXX}"
    "-DCMAKE_CXX_FLAGS=${CXX_FLAGS}")
if(TOOLCHAIN)
  list(APPEND configure "-DCMAKE_TOOLCHAIN_FILE=${TOOLCHAIN}")
endif()
run("configuring the find_package consumer" ${configure})
run("building the find_package consumer" ${CMAKE_COMMAND} --build "${WORK}/cmake-build")
run("running the find_package consumer" ${run_env} ${EMULATOR} "${WORK}/cmake-build/example")
if(NOT out MATCHES "${expected}")
  message(FATAL_ERROR "the find_package consumer printed: ${out}")
endif()
message(STATUS "find_package(Glimmer): ${out}")

# 2. pkg-config, with nothing but the install on its search path.
file(GLOB_RECURSE pc "${prefix}/*/glimmer.pc")
if(NOT pc)
  message(FATAL_ERROR "no glimmer.pc under ${prefix}")
endif()
get_filename_component(pc_dir "${pc}" DIRECTORY)
set(pkg_config ${CMAKE_COMMAND} -E env "PKG_CONFIG_LIBDIR=${pc_dir}" PKG_CONFIG_PATH= pkg-config)
run("pkg-config --cflags --libs" ${pkg_config} --cflags --libs glimmer)
separate_arguments(flags UNIX_COMMAND "${out}")
run("pkg-config --variable=libdir" ${pkg_config} --variable=libdir glimmer)
string(STRIP "${out}" libdir)
separate_arguments(cxx_flags UNIX_COMMAND "${CXX_FLAGS}")
run("building the pkg-config consumer" ${CXX} -std=c++20 -Wall -Wextra -Werror ${cxx_flags}
    "${WORK}/example.cpp" ${flags} "-Wl,-rpath,${libdir}" -o "${WORK}/example-pc")
run("running the pkg-config consumer" ${run_env} ${EMULATOR} "${WORK}/example-pc")
if(NOT out MATCHES "${expected}")
  message(FATAL_ERROR "the pkg-config consumer printed: ${out}")
endif()
message(STATUS "pkg-config glimmer: ${out}")

# 3. The installed renderer.
if(RENDERER)
  run("the installed glimmer-render" ${run_env} ${EMULATOR} "${prefix}/bin/glimmer-render" --version)
  if(NOT out MATCHES "^glimmer-render [0-9]+\\.[0-9]+\\.[0-9]+\n$")
    message(FATAL_ERROR "the installed glimmer-render printed: ${out}")
  endif()
endif()
