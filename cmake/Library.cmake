# SPDX-License-Identifier: MIT
# The layers' sources are compiled once, as objects. The shared library exports only what a host needs; tests link
# the objects themselves, and so reach what is hidden.
#
# vclink_add_layer_objects(TARGET): adds objects that are compiled like those of the layers.
option(VCLINK_UNITY_LAYERS "Let CMAKE_UNITY_BUILD join the layers' sources too" OFF)
function(vclink_add_layer_objects target)
    add_library(${target} OBJECT)
    vclink_configure_target(${target})
    target_link_libraries(${target} PRIVATE vclink_hardening)
    # Complete debug information in each preset: the debug-symbol packages and scripts/abi need it.
    target_compile_options(${target} PRIVATE $<$<CONFIG:RelWithDebInfo>:-g2>)
    if(NOT VCLINK_UNITY_LAYERS)
        set_target_properties(${target} PROPERTIES UNITY_BUILD OFF)
    else()
        # Each unit has its own copy of what the headers define, and of the sanitizers' tables for it.
        set_target_properties(${target} PROPERTIES UNITY_BUILD_BATCH_SIZE 36)
    endif()
endfunction()

vclink_add_layer_objects(vclink_git_objects)
vclink_measure(vclink_git_objects)
target_include_directories(vclink_git_objects PUBLIC
    ${PROJECT_SOURCE_DIR} ${PROJECT_SOURCE_DIR}/include)
target_link_libraries(vclink_git_objects
    PUBLIC vclink::host Boost::headers Boost::filesystem Boost::thread PkgConfig::libgit2)

add_library(vclink_git SHARED)
add_library(vclink::git ALIAS vclink_git)
vclink_configure_target(vclink_git)
target_link_libraries(vclink_git
    PRIVATE vclink_git_objects $<BUILD_INTERFACE:vclink_hardening>
    PUBLIC vclink::host Boost::headers)
target_include_directories(vclink_git PUBLIC
    $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include>
    $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)
set_target_properties(vclink_git PROPERTIES
    VERSION ${PROJECT_VERSION}
    SOVERSION ${PROJECT_VERSION_MAJOR}
    EXPORT_NAME git
    INSTALL_RPATH "$ORIGIN"
    LINK_DEPENDS "${PROJECT_SOURCE_DIR}/cmake/exports.map"
    LIBRARY_OUTPUT_DIRECTORY "${VCLINK_STAGE_DIR}/${CMAKE_INSTALL_LIBDIR}")
target_link_options(vclink_git PRIVATE
    "LINKER:--version-script,${PROJECT_SOURCE_DIR}/cmake/exports.map")
