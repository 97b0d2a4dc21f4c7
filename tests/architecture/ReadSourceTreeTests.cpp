// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "SourceTree.hpp"
#include "support/TemporaryFolder.hpp"

namespace
{

using namespace vclink::test;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Pair;

TEST(ReadSourceTree, GivesTheSourcesOfTheFoldersAndNothingElse)
{
    const TemporaryFolder folder;
    for (const auto *name : {"main/deep/a.cpp", "main/b.hpp", "main/CMakeLists.txt", "other/c.cpp"})
    {
        std::filesystem::create_directories((folder / name).parent_path());
        std::ofstream(folder / name) << "content of " << name;
    }
    EXPECT_THAT(readSourceTree(folder.path(), {"main", "missing"}),
                ElementsAre(Pair("main/b.hpp", "content of main/b.hpp"),
                            Pair("main/deep/a.cpp", "content of main/deep/a.cpp")));
}

TEST(FindIncludes, GivesThemAsWritten)
{
    EXPECT_THAT(
        findIncludes("// text\n#include <a>\n#include \"b/c.hpp\"\n  #  include<d.h> // x\n"),
        ElementsAre("a", "b/c.hpp", "d.h"));
}

TEST(FindIncludes, LeavesOutWhatIsCommentedOut)
{
    EXPECT_THAT(findIncludes("// #include <a>\nint include;\n"), IsEmpty());
}

TEST(ResolveInclude, LooksInTheFilesOwnFolderFirst)
{
    const SourceTree tree{{"error/a.hpp", ""}, {"include/a.hpp", ""}, {"main/b.hpp", ""}};
    EXPECT_EQ(resolveInclude(tree, "error/b.cpp", "a.hpp"), "error/a.hpp");
    EXPECT_EQ(resolveInclude(tree, "main/b.cpp", "a.hpp"), "include/a.hpp");
    EXPECT_EQ(resolveInclude(tree, "error/b.cpp", "../main/b.hpp"), "main/b.hpp");
    EXPECT_EQ(resolveInclude(tree, "error/b.cpp", "git2.h"), "");
}

} // namespace
