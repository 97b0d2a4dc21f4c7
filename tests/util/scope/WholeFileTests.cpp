// SPDX-License-Identifier: MIT
#include <cerrno>
#include <fstream>
#include <string>

#include <gtest/gtest.h>
#include <sys/stat.h>

#include "support/TemporaryFolder.hpp"
#include "util/scope/wholeFile.hpp"

namespace
{

using vclink::git::readWholeFile;
using namespace vclink::test;

class WholeFile : public testing::Test
{
  protected:
    const TemporaryFolder folder;
    const std::string path = folder / "file";
    std::string content = "of another file";
};

TEST_F(WholeFile, GivesAllBytesOfManyBlocks)
{
    std::string text = "begin\n";
    text.append(9000, '\0');
    text += "\xFF\r\nend";
    std::ofstream(path, std::ios::binary) << text;
    EXPECT_EQ(readWholeFile(path, content), 0);
    EXPECT_EQ(content, text);
}

TEST_F(WholeFile, IsEmptyForAnEmptyFile)
{
    std::ofstream(path) << "";
    EXPECT_EQ(readWholeFile(path, content), 0);
    EXPECT_EQ(content, "");
}

TEST_F(WholeFile, GivesTheErrorOfTheFirstCallThatFails)
{
    EXPECT_EQ(readWholeFile(path, content), ENOENT);
    EXPECT_EQ(readWholeFile(folder.path().string(), content), EISDIR);
    EXPECT_EQ(content, "");
}

TEST_F(WholeFile, DoesNotWaitForTheWriterOfAFifo)
{
    ASSERT_EQ(::mkfifo(path.c_str(), S_IRUSR | S_IWUSR), 0);
    EXPECT_EQ(readWholeFile(path, content), 0);
    EXPECT_EQ(content, "");
}

} // namespace
