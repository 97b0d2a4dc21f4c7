# SPDX-License-Identifier: MIT
# vclink_warnings: the warnings that every target of this repository compiles with. Never exported.
add_library(vclink_warnings INTERFACE)
target_compile_options(vclink_warnings INTERFACE -Wall -Wextra -Wpedantic -Wshadow -Wconversion)
if(VCLINK_WARNINGS_AS_ERRORS)
    target_compile_options(vclink_warnings INTERFACE -Werror)
endif()
