// SPDX-License-Identifier: MIT
#include <boost/filesystem/operations.hpp>
#include <gtest/gtest.h>

#include "fl/filesystem/operations.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink_host/installation.hpp"

TEST(StandInInstallation, IsTheFolderAboveTheLibraryItself)
{
    const std::string path = fl::i18n::to_string(fl::filesystem::get_install_path());
    EXPECT_EQ(path, boost::filesystem::canonical(VCLINK_STAGE_DIR).string());
}

TEST(StandInInstallation, IsWhatTheHostSays)
{
    const ustring before = fl::filesystem::get_install_path();
    vclink_host::setInstallPath(u"/opt/host");
    EXPECT_EQ(fl::filesystem::get_install_path(), u"/opt/host");
    vclink_host::setInstallPath(u"/opt/other//");
    EXPECT_EQ(fl::filesystem::get_install_path(), u"/opt/other");
    vclink_host::setInstallPath(before);
    EXPECT_EQ(fl::filesystem::get_install_path(), before);
}
