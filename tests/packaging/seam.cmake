# SPDX-License-Identifier: MIT
# cmake -D BUILD=... -D SOURCE=... -D WORK=... -D COMPILER=... -P seam.cmake
# The library on an SDK that is not built with it: a copy of the sources that has nothing of host/
# but the contract's suite is built against the stand-in as installed from BUILD, then the suite
# runs. What was compiled in WORK before is used again.
set(prefix "${WORK}/sdk")
set(source "${WORK}/source")
set(build "${WORK}/build")
file(REMOVE_RECURSE "${prefix}" "${source}")

foreach(component IN ITEMS host-runtime host-development)
    execute_process(
        COMMAND ${CMAKE_COMMAND} --install "${BUILD}" --prefix "${prefix}" --component ${component}
        OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
endforeach()
foreach(entry IN ITEMS CMakeLists.txt LICENSE README.md cmake error fuzz include main options tests util)
    file(COPY "${SOURCE}/${entry}" DESTINATION "${source}")
endforeach()
file(COPY "${SOURCE}/host/tests" DESTINATION "${source}/host")

# Compiled without optimisation: what it is counts here, not how fast.
execute_process(
    COMMAND ${CMAKE_COMMAND} -G Ninja -S "${source}" -B "${build}"
        -D CMAKE_BUILD_TYPE=Debug
        -D "CMAKE_CXX_FLAGS_DEBUG=-O0 -g0"
        -D CMAKE_UNITY_BUILD=ON
        -D CMAKE_UNITY_BUILD_BATCH_SIZE=12
        -D VCLINK_UNITY_LAYERS=ON
        -D "CMAKE_CXX_COMPILER=${COMPILER}"
        -D "CMAKE_PREFIX_PATH=${prefix}"
        -D VCLINK_HOST=package
        -D VCLINK_BUILD_EXAMPLES=OFF
    OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
execute_process(
    COMMAND ${CMAKE_COMMAND} --build "${build}" --parallel 2
        --target vclink_git vclink_host_tests
    COMMAND_ERROR_IS_FATAL ANY)

file(STRINGS "${build}/CMakeCache.txt" found REGEX "^vclink_host_DIR:PATH=")
string(FIND "${found}" "vclink_host_DIR:PATH=${prefix}/" place)
if(NOT place EQUAL 0)
    message(FATAL_ERROR "The library was built against another SDK: ${found}")
endif()
execute_process(COMMAND "${build}/host/tests/vclink_host_tests" --gtest_brief=1
    OUTPUT_VARIABLE said COMMAND_ERROR_IS_FATAL ANY)
if(NOT said MATCHES "PASSED  . [1-9][0-9]+ tests")
    message(FATAL_ERROR "The contract's suite did not run: ${said}")
endif()
message(STATUS "${said}")
# Without optimisation far more templates are instantiated that could be seen.
file(GLOB library "${build}/stage/*/libvclink_git.so" "${build}/stage/*/*/libvclink_git.so")
execute_process(COMMAND "${SOURCE}/scripts/abi" --symbols "${library}" COMMAND_ERROR_IS_FATAL ANY)
