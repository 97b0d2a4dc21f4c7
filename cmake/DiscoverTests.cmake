# SPDX-License-Identifier: MIT
# Runs after a test program is linked: lists its GoogleTest cases and writes tests for ctest, one for each suite, or
# with EACH_CASE one for each case. See cmake/Tests.cmake.
cmake_minimum_required(VERSION 3.25)

# vclink_write_test(SUBJECT FILTER CASES): appends to `script`.
function(vclink_write_test subject filter cases)
    set(name "[==[${NAME}.${subject}]==]")
    math(EXPR cost "${cases} * ${COST}")
    list(JOIN PROPERTIES " " properties)
    string(APPEND script
        "add_test(${name} [==[${PROGRAM}]==] [==[--gtest_filter=${filter}]==])\n"
        "set_tests_properties(${name} PROPERTIES\n"
        "    WORKING_DIRECTORY [==[${FOLDER}]==]\n"
        "    FAIL_REGULAR_EXPRESSION [==[Running 0 tests;\\[  SKIPPED \\]]==]\n"
        "    COST ${cost} ${properties})\n")
    set(script "${script}" PARENT_SCOPE)
endfunction()

execute_process(
    COMMAND "${PROGRAM}" --gtest_list_tests
    TIMEOUT 60
    OUTPUT_VARIABLE output
    RESULT_VARIABLE result)
if(NOT result EQUAL 0)
    message(FATAL_ERROR "${PROGRAM} does not list its tests: ${result}\n${output}")
endif()
# A line that is not indented and ends with a dot is a suite; an indented line is a case. Values of parameters
# follow a '#', and can contain anything.
string(REGEX REPLACE "#[^\n]*" "" output "${output}")
string(REGEX REPLACE " *\n" ";" lines "${output}")

set(script "")
set(suite "")
set(cases 0)
foreach(line IN LISTS lines ITEMS "end.")
    if(line MATCHES "DISABLED_")
        message(FATAL_ERROR "${PROGRAM}: this test would never run: ${line}")
    elseif(line MATCHES "^  ([^ ]+)$")
        math(EXPR cases "${cases} + 1")
        if(EACH_CASE)
            vclink_write_test("${suite}.${CMAKE_MATCH_1}" "${suite}.${CMAKE_MATCH_1}" 1)
        endif()
    elseif(line MATCHES "^([^ ]+)\\.$")
        set(next "${CMAKE_MATCH_1}")
        if(cases GREATER 0 AND NOT EACH_CASE)
            vclink_write_test("${suite}" "${suite}.*" ${cases})
        endif()
        set(suite "${next}")
        set(cases 0)
    endif()
endforeach()
if(NOT script)
    message(FATAL_ERROR "${PROGRAM} has no tests")
endif()
file(WRITE "${FILE}" "${script}")
