# SPDX-License-Identifier: MIT
# cmake -D CPACK=... -D BUILD=... -D PACKAGES=... -P packages.cmake
# Makes the Debian packages of a build, in a folder that holds nothing else then.
file(REMOVE_RECURSE "${PACKAGES}")
execute_process(
    COMMAND "${CPACK}" -G DEB -B "${PACKAGES}"
    WORKING_DIRECTORY "${BUILD}"
    COMMAND_ERROR_IS_FATAL ANY)
