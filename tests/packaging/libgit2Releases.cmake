# SPDX-License-Identifier: MIT
# cmake -D SOURCE=... -D WORK=... -P libgit2Releases.cmake
# Which releases of libgit2 cmake/Dependencies.cmake refuses, by pkg-config files that only name a release.
cmake_minimum_required(VERSION 3.25)
file(REMOVE_RECURSE "${WORK}")
file(WRITE "${WORK}/project/CMakeLists.txt"
    "cmake_minimum_required(VERSION 3.25)\n"
    "project(releases LANGUAGES NONE)\n"
    "include(\"${SOURCE}/cmake/Dependencies.cmake\")\n")

set(refused 1.4.6 1.8.0 1.8.1)
foreach(release IN ITEMS 1.4.6 1.5.0 1.8.0 1.8.1 1.8.2 1.9.0 1.10.0)
    file(WRITE "${WORK}/${release}/libgit2.pc" "Name: libgit2\nDescription: none\nVersion: ${release}\n")
    # Never succeeds: without a language there is no Boost, which comes next.
    execute_process(
        COMMAND "${CMAKE_COMMAND}" -E env "PKG_CONFIG_PATH=${WORK}/${release}"
            "${CMAKE_COMMAND}" -S "${WORK}/project" -B "${WORK}/build-${release}"
        OUTPUT_VARIABLE said ERROR_VARIABLE said)
    set(answer "accepted")
    if(NOT said MATCHES "Found libgit2, version ${release}\n" OR said MATCHES "install 1\\.8\\.2 or later")
        set(answer "refused")
    endif()
    set(expected "accepted")
    if(release IN_LIST refused)
        set(expected "refused")
    endif()
    if(NOT answer STREQUAL expected)
        message(FATAL_ERROR "libgit2 ${release} is ${answer}:\n${said}")
    endif()
endforeach()
