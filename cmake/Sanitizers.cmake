# SPDX-License-Identifier: MIT
# vclink_instrumentation: sanitizers and coverage, as the presets choose them. Never exported.
add_library(vclink_instrumentation INTERFACE)
if(VCLINK_SANITIZE)
    list(JOIN VCLINK_SANITIZE "," sanitizers)
    target_compile_options(vclink_instrumentation INTERFACE
        -fsanitize=${sanitizers} -fno-sanitize-recover=all -fno-omit-frame-pointer)
    target_link_options(vclink_instrumentation INTERFACE -fsanitize=${sanitizers})
endif()
if(VCLINK_COVERAGE)
    target_compile_options(vclink_instrumentation INTERFACE --coverage -fprofile-abs-path)
    target_link_options(vclink_instrumentation INTERFACE --coverage)
endif()
