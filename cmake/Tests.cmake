# SPDX-License-Identifier: MIT
# Programs of GoogleTest cases, and how ctest runs them.

# vclink_discover_tests(TARGET LABEL label [EACH_CASE] [COST cost] [TIMEOUT seconds]
#     [PROPERTIES name value...]): makes each suite of the program a test of ctest, called
# PROGRAM.SUITE. The cases of a suite run one after the other in one process, because the start of a
# program under the sanitizers takes longer than most cases. With EACH_CASE each case is a test,
# called PROGRAM.SUITE.CASE, with a process of its own: for long cases, so that no processor is idle
# at the end, and for threads, because some races occur only when something is used for the first
# time. COST is the time of a case in tenths of a second, 1 by default: ctest starts the longest
# tests first. TIMEOUT is the limit of a test in seconds, 600 by default.
#
# The target vclink_tests_labelled_LABEL builds the programs with this label.
#
# A skipped case is a failure, and so is a program that ends before its last case.
add_library(vclink_test_complete_run OBJECT
    ${CMAKE_CURRENT_LIST_DIR}/../tests/support/completeRun.cpp)
vclink_configure_test_target(vclink_test_complete_run)
target_link_libraries(vclink_test_complete_run PRIVATE GTest::gtest)

function(vclink_discover_tests target)
    cmake_parse_arguments(PARSE_ARGV 1 arg "EACH_CASE" "LABEL;COST;TIMEOUT" "PROPERTIES")
    if(NOT arg_LABEL OR arg_UNPARSED_ARGUMENTS)
        message(FATAL_ERROR "${target}: one label, not '${arg_LABEL};${arg_UNPARSED_ARGUMENTS}'")
    endif()
    if(NOT arg_COST)
        set(arg_COST 1)
    endif()
    if(NOT arg_TIMEOUT)
        set(arg_TIMEOUT 600)
    endif()
    target_link_libraries(${target} PRIVATE vclink_test_complete_run)
    if(NOT TARGET vclink_tests_labelled_${arg_LABEL})
        add_custom_target(vclink_tests_labelled_${arg_LABEL})
    endif()
    add_dependencies(vclink_tests_labelled_${arg_LABEL} ${target})
    # A mutant may be unable to list its tests; scripts/mutate runs the programs itself.
    if(VCLINK_RECORD_REACH)
        return()
    endif()
    set(file "${CMAKE_CURRENT_BINARY_DIR}/${target}.tests.cmake")
    add_custom_command(TARGET ${target} POST_BUILD
        COMMAND "${CMAKE_COMMAND}"
            -D "NAME=${target}"
            -D "PROGRAM=$<TARGET_FILE:${target}>"
            -D "FOLDER=${CMAKE_CURRENT_BINARY_DIR}"
            -D "EACH_CASE=${arg_EACH_CASE}"
            -D "COST=${arg_COST}"
            -D "PROPERTIES=LABELS;${arg_LABEL};TIMEOUT;${arg_TIMEOUT};${arg_PROPERTIES}"
            -D "FILE=${file}"
            -P "${PROJECT_SOURCE_DIR}/cmake/DiscoverTests.cmake"
        BYPRODUCTS "${file}"
        VERBATIM)
    set(include "${CMAKE_CURRENT_BINARY_DIR}/${target}.include.cmake")
    file(CONFIGURE OUTPUT "${include}" @ONLY CONTENT [[
if(EXISTS "@file@")
    include("@file@")
else()
    add_test(@target@_NOT_BUILT @target@_NOT_BUILT)
endif()
]])
    set_property(DIRECTORY APPEND PROPERTY TEST_INCLUDE_FILES "${include}")
endfunction()

# vclink_add_tests(TARGET LABEL label SOURCES file... [LIBRARIES library...] [EACH_CASE]
#     [COST cost]): adds such a program. It links the layers' objects, so that tests reach what the
# library hides.
#
# The objects come first on the link line. If the test has compiled the same inline function, the
# linker keeps the layers' copy, with their instrumentation and optimisation; tests can have less of
# both (VCLINK_TEST_FLAGS). tests/instrumentation checks this.
set(VCLINK_RUN_LABELS "" CACHE STRING
    "Labels of the tests that this build runs, all if empty; other tests only have to compile")

# vclink_is_run(RESULT LABEL...): sets RESULT to true if this build runs tests with one of the labels.
function(vclink_is_run result)
    set(${result} FALSE PARENT_SCOPE)
    foreach(label IN LISTS ARGN)
        if(NOT VCLINK_RUN_LABELS OR label IN_LIST VCLINK_RUN_LABELS)
            set(${result} TRUE PARENT_SCOPE)
        endif()
    endforeach()
endfunction()

# vclink_configure_tests(TARGET LABEL...): configures a program or library whose tests have these labels. If this
# build runs none of them, the compiler only reports errors and warnings, and makes no code.
function(vclink_configure_tests target)
    vclink_configure_test_target(${target})
    vclink_is_run(run ${ARGN})
    if(NOT run)
        set_target_properties(${target} PROPERTIES
            CXX_COMPILER_LAUNCHER "${PROJECT_SOURCE_DIR}/cmake/checkOnly.sh")
    endif()
endfunction()

function(vclink_add_tests target)
    cmake_parse_arguments(PARSE_ARGV 1 arg "EACH_CASE" "LABEL;COST" "SOURCES;LIBRARIES")
    if(arg_UNPARSED_ARGUMENTS)
        message(FATAL_ERROR "${target}: what is '${arg_UNPARSED_ARGUMENTS}'?")
    endif()
    vclink_is_run(run ${arg_LABEL})
    if(run)
        add_executable(${target} ${arg_SOURCES})
    else()
        add_library(${target} OBJECT ${arg_SOURCES})
    endif()
    vclink_configure_tests(${target} ${arg_LABEL})
    target_link_libraries(${target} PRIVATE
        vclink_git_objects vclink_test_suppressions vclink_test_support ${arg_LIBRARIES}
        GTest::gmock GTest::gtest_main)
    if(NOT run)
        return()
    endif()
    if(VCLINK_RECORD_REACH)
        target_sources(${target} PRIVATE ${PROJECT_SOURCE_DIR}/tests/support/ReachRecorder.cpp)
        target_link_libraries(${target} PRIVATE ${CMAKE_DL_LIBS})
    endif()
    set(options)
    if(arg_EACH_CASE)
        list(APPEND options EACH_CASE)
    endif()
    if(arg_COST)
        list(APPEND options COST ${arg_COST})
    endif()
    vclink_discover_tests(${target} LABEL ${arg_LABEL} ${options})
endfunction()
