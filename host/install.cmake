# SPDX-License-Identifier: MIT
# The stand-in has packages of its own, which are not installed beside the host's real SDK.
install(TARGETS vclink_host EXPORT vclink_host
    LIBRARY DESTINATION "${CMAKE_INSTALL_LIBDIR}"
        COMPONENT host-runtime NAMELINK_COMPONENT host-development)
install(DIRECTORY include/
    DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}/vclink_host"
    COMPONENT host-development
    FILES_MATCHING PATTERN "*.hpp")
vclink_install_package_files(vclink_host "${CMAKE_CURRENT_SOURCE_DIR}/package"
    COMPONENT host-development)

# Both are found under these names below the installation folder, whatever GNUInstallDirs says.
install(DIRECTORY "${VCLINK_STAGE_DIR}/share/locale"
    DESTINATION share
    COMPONENT host-runtime)
install(PROGRAMS bin/lnxhost/vkAutoMerge.sh bin/lnxhost/vkDiff bin/lnxhost/vkMerge
    DESTINATION bin/lnxhost
    COMPONENT host-runtime)
