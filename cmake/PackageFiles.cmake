# SPDX-License-Identifier: MIT
# vclink_install_package_files(PACKAGE FOLDER COMPONENT component): installs the files with which CMake and
# pkg-config find the library, from the templates in FOLDER. Their paths are relative to the files themselves, so
# that an installation can be moved as a whole.
include(CMakePackageConfigHelpers)

if(VCLINK_INSTALL)
    foreach(folder IN ITEMS BINDIR INCLUDEDIR LIBDIR)
        if(IS_ABSOLUTE "${CMAKE_INSTALL_${folder}}")
            message(FATAL_ERROR "CMAKE_INSTALL_${folder} is to be relative to the prefix.")
        endif()
    endforeach()
endif()

function(vclink_install_package_files package folder)
    cmake_parse_arguments(PARSE_ARGV 2 arg "" "COMPONENT" "")
    set(cmake_folder "${CMAKE_INSTALL_LIBDIR}/cmake/${package}")
    set(pkgconfig_folder "${CMAKE_INSTALL_LIBDIR}/pkgconfig")
    set(made "${PROJECT_BINARY_DIR}/package")

    configure_package_config_file(
        "${folder}/${package}Config.cmake.in" "${made}/${package}Config.cmake"
        INSTALL_DESTINATION "${cmake_folder}"
        NO_SET_AND_CHECK_MACRO NO_CHECK_REQUIRED_COMPONENTS_MACRO)
    write_basic_package_version_file("${made}/${package}ConfigVersion.cmake"
        COMPATIBILITY SameMajorVersion)
    install(EXPORT ${package}
        FILE "${package}Targets.cmake"
        NAMESPACE vclink::
        DESTINATION "${cmake_folder}"
        COMPONENT ${arg_COMPONENT})
    install(FILES "${made}/${package}Config.cmake" "${made}/${package}ConfigVersion.cmake"
        DESTINATION "${cmake_folder}"
        COMPONENT ${arg_COMPONENT})

    file(RELATIVE_PATH prefix "/${pkgconfig_folder}" "/")
    set(VCLINK_PC_PREFIX "\${pcfiledir}/${prefix}")
    string(REGEX REPLACE "/$" "" VCLINK_PC_PREFIX "${VCLINK_PC_PREFIX}")
    configure_file("${folder}/${package}.pc.in" "${made}/${package}.pc" @ONLY)
    install(FILES "${made}/${package}.pc"
        DESTINATION "${pkgconfig_folder}"
        COMPONENT ${arg_COMPONENT})
endfunction()
