# Builds and runs the consumer project; fails on any step that fails. In
# "installed" mode the tree is installed into a private prefix first, the
# consumer is built once through the CMake package and once through the
# pkg-config file, and the installed ravel-dump runs from there.
function(run)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE result OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT result EQUAL 0)
    message(FATAL_ERROR "${ARGN}\n${out}\n${err}")
  endif()
  set(run_output "${out}" PARENT_SCOPE)
endfunction()

file(REMOVE_RECURSE ${WORK_DIR})
set(consumer_source ${SOURCE_DIR}/tests/consumer)
set(prefix ${WORK_DIR}/prefix)
# Built as the tree under test was: its toolchain, its sanitizers (an installed
# sanitized library needs the runtime linked into the program).
set(build_options)
if(TOOLCHAIN_FILE)
  list(APPEND build_options -DCMAKE_TOOLCHAIN_FILE=${TOOLCHAIN_FILE} -DCMAKE_FIND_ROOT_PATH=${prefix})
endif()
if(SANITIZE)
  list(APPEND build_options -DRAVEL_SANITIZE=ON "-DCMAKE_EXE_LINKER_FLAGS=-fsanitize=address,undefined")
endif()
string(REPLACE "|" ";" emulator "${EMULATOR}")

function(build_and_run_consumer name)
  run(${CMAKE_COMMAND} -S ${consumer_source} -B ${WORK_DIR}/${name} ${build_options} ${ARGN})
  run(${CMAKE_COMMAND} --build ${WORK_DIR}/${name} -j2)
  run(${emulator} ${WORK_DIR}/${name}/consumer)
endfunction()

if(NOT MODE STREQUAL "installed")
  build_and_run_consumer(build -DRAVEL_SOURCE_TREE=${SOURCE_DIR})
  return()
endif()

run(${CMAKE_COMMAND} --install ${BINARY_DIR} --prefix ${prefix})
# Only the API is installed: none of the library's private helper headers.
file(GLOB private_headers RELATIVE ${SOURCE_DIR}/SectionParser/include/private
     ${SOURCE_DIR}/SectionParser/include/private/*.h)
foreach(header ${private_headers})
  file(GLOB_RECURSE installed ${prefix}/${header})
  if(installed)
    message(FATAL_ERROR "private header installed: ${installed}")
  endif()
endforeach()
# The consumers find the shared library through their build RPATH, the
# installed tool through its own install RPATH: nothing else may point there.
unset(ENV{LD_LIBRARY_PATH})
build_and_run_consumer(build-cmake-package -DCMAKE_PREFIX_PATH=${prefix})

# Only PKG_CONFIG_PATH names the prefix: the paths in the file must lead there.
set(ENV{PKG_CONFIG_PATH} ${prefix}/${INSTALL_LIBDIR}/pkgconfig)
find_program(pkg_config NAMES pkg-config pkgconf REQUIRED)
run(${pkg_config} --cflags ravel_sectionparser)
string(FIND "${run_output}" "-I${prefix}/" at)
if(at EQUAL -1)
  message(FATAL_ERROR "pkg-config --cflags names no folder of the prefix ${prefix}: ${run_output}")
endif()
build_and_run_consumer(build-pkg-config -DRAVEL_FIND_WITH_PKG_CONFIG=ON)

if(INSTALLED_TOOL)
  run(${emulator} ${prefix}/${INSTALLED_TOOL} --version)
  string(REPLACE "|" ";" installed_files "${INSTALLED_FILES}")
  foreach(file ${installed_files})
    if(NOT EXISTS ${prefix}/${file})
      message(FATAL_ERROR "not installed: ${file}")
    endif()
  endforeach()
endif()
