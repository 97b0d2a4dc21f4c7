# SPDX-License-Identifier: MIT
# What every compiled target of this repository has in common.
function(vclink_configure_target target)
    target_compile_features(${target} PUBLIC cxx_std_17)
    set_target_properties(${target} PROPERTIES
        CXX_EXTENSIONS OFF
        CXX_VISIBILITY_PRESET hidden
        C_VISIBILITY_PRESET hidden
        VISIBILITY_INLINES_HIDDEN ON
        POSITION_INDEPENDENT_CODE ON)
    target_link_libraries(${target} PRIVATE
        $<BUILD_INTERFACE:vclink_warnings> $<BUILD_INTERFACE:vclink_instrumentation>)
endfunction()

# Shared libraries and programs lie in the build tree as they do when installed, so that what is
# found relative to them is found in both.
set(VCLINK_STAGE_DIR "${PROJECT_BINARY_DIR}/stage")
