# Installs the build into a scratch prefix and checks the public surface:
# no header from a detail/ folder is installed, the umbrella header includes
# installed headers only, and every installed header compiles on its own.
#
#   cmake -DBUILD_DIR=build/dev -DPREFIX=/tmp/p -DCXX=g++ -P tests/install/CheckInstall.cmake
cmake_policy(VERSION 3.25)

foreach(var BUILD_DIR PREFIX CXX)
    if(NOT DEFINED ${var})
        message(FATAL_ERROR "CheckInstall: ${var} is not set")
    endif()
endforeach()

file(REMOVE_RECURSE "${PREFIX}")
execute_process(COMMAND "${CMAKE_COMMAND}" --install "${BUILD_DIR}" --prefix "${PREFIX}"
    RESULT_VARIABLE result OUTPUT_QUIET)
if(NOT result EQUAL 0)
    message(FATAL_ERROR "CheckInstall: cmake --install failed (${result})")
endif()

set(include_dir "${PREFIX}/include")
file(GLOB_RECURSE headers RELATIVE "${include_dir}" "${include_dir}/oxbase/*.h")
if(NOT headers)
    message(FATAL_ERROR "CheckInstall: no header installed below ${include_dir}/oxbase")
endif()
foreach(header IN LISTS headers)
    if(header MATCHES "/detail/")
        message(FATAL_ERROR "CheckInstall: internal header installed: ${header}")
    endif()
endforeach()

# The umbrella header names installed headers only.
file(STRINGS "${include_dir}/oxbase/OxBase.h" includes REGEX "^#include \"oxbase/")
foreach(line IN LISTS includes)
    string(REGEX REPLACE "^#include \"([^\"]+)\".*" "\\1" included "${line}")
    if(NOT included IN_LIST headers)
        message(FATAL_ERROR "CheckInstall: OxBase.h includes ${included}, which is not installed")
    endif()
endforeach()

# One translation unit per header, all in one compiler run.
set(sources "")
foreach(header IN LISTS headers)
    string(MAKE_C_IDENTIFIER "${header}" name)
    set(source "${PREFIX}/check/${name}.cpp")
    file(WRITE "${source}" "#include \"${header}\"\n#include \"${header}\"\n")
    list(APPEND sources "${source}")
endforeach()
execute_process(COMMAND "${CXX}" -std=c++17 -fsyntax-only -Wall -Wextra -Wpedantic -Werror
                        -I "${include_dir}" ${sources}
    RESULT_VARIABLE result OUTPUT_VARIABLE output ERROR_VARIABLE output)
if(NOT result EQUAL 0)
    message(FATAL_ERROR "CheckInstall: an installed header does not compile alone:\n${output}")
endif()
list(LENGTH headers count)
message(STATUS "CheckInstall: ${count} public headers, each compiles on its own")
