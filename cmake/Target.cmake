# SPDX-License-Identifier: MIT
# Settings of every compiled target of this repository.
function(vclink_configure_language target)
    target_compile_features(${target} PUBLIC cxx_std_17)
    set_target_properties(${target} PROPERTIES
        CXX_EXTENSIONS OFF
        CXX_VISIBILITY_PRESET hidden
        C_VISIBILITY_PRESET hidden
        VISIBILITY_INLINES_HIDDEN ON
        POSITION_INDEPENDENT_CODE ON)
    target_link_libraries(${target} PRIVATE $<BUILD_INTERFACE:vclink_warnings>)
endfunction()

function(vclink_configure_target target)
    vclink_configure_language(${target})
    target_link_libraries(${target} PRIVATE $<BUILD_INTERFACE:vclink_instrumentation>)
endfunction()

# Tests and their helpers compile with these flags instead of those of the configuration and the sanitizers. If two
# presets have the same flags, the compiler cache serves both. The layers, the stand-in and the programs keep the
# flags of the preset.
set(VCLINK_TEST_FLAGS "" CACHE STRING "Compiler flags of tests; empty: those of everything else")
set(VCLINK_TEST_LINK_OPTIONS "" CACHE STRING "Linker options of tests, besides those of everything")

function(vclink_configure_test_target target)
    target_link_options(${target} PRIVATE ${VCLINK_TEST_LINK_OPTIONS})
    if(VCLINK_TEST_FLAGS)
        vclink_configure_language(${target})
        target_link_libraries(${target} PRIVATE vclink_linked_instrumentation)
    else()
        vclink_configure_target(${target})
    endif()
endfunction()

# vclink_use_test_flags(): for a folder with nothing but tests, before its targets.
macro(vclink_use_test_flags)
    if(VCLINK_TEST_FLAGS)
        string(TOUPPER "CMAKE_CXX_FLAGS_${CMAKE_BUILD_TYPE}" vclink_configuration_flags)
        set(${vclink_configuration_flags} "${VCLINK_TEST_FLAGS}")
    endif()
endmacro()

# Shared libraries and programs have the same layout in the build tree as when they are installed, so that both find
# files relative to themselves.
set(VCLINK_STAGE_DIR "${PROJECT_BINARY_DIR}/stage")
