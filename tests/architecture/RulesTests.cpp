// SPDX-License-Identifier: MIT
// The rules themselves, on small trees that are made up: what is right passes, and each way to
// break a rule is found.
#include <cctype>
#include <ostream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "rules.hpp"

namespace
{

using namespace vclink::test;
using testing::Contains;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Not;

/// A tree in which nothing includes anything, with a file for each layer.
SourceTree makeTree()
{
    return {{"host/include/fl/ustring.hpp", ""},
            {"host/include/vclink_host/export.hpp", ""},
            {"host/include/vclink_host/log.hpp", ""},
            {"host/src/logger.cpp", ""},
            {"include/vclink/git/Guard.hpp", ""},
            {"include/vclink/git/Error.hpp", ""},
            {"error/Result.hpp", ""},
            {"error/Result.cpp", ""},
            {"util/paths.hpp", ""},
            {"options/Callbacks.hpp", ""},
            {"main/Adapter.hpp", ""},
            {"main/Adapter.cpp", ""},
            {"examples/shell/main.cpp", ""},
            {"tests/support/Command.hpp", ""}};
}

SourceTree makeTreeWith(const std::string &file, const std::string &content)
{
    auto tree = makeTree();
    tree[file] = content;
    return tree;
}

struct Arrow
{
    std::string file;
    std::string include;
    std::string target;
};

void PrintTo(const Arrow &arrow, std::ostream *stream)
{
    *stream << arrow.file << " includes " << arrow.include;
}

/// Names a case after its two layers, e.g. "ErrorToMain".
std::string nameOf(const testing::TestParamInfo<Arrow> &info)
{
    auto from = layerOf(info.param.file);
    auto to = layerOf(info.param.target);
    for (auto *layer : {&from, &to})
        layer->front() = static_cast<char>(std::toupper(layer->front()));
    return from + "To" + to;
}

class BrokenLayers : public testing::TestWithParam<Arrow>
{
};

TEST_P(BrokenLayers, AreFound)
{
    const auto &[file, include, target] = GetParam();
    const auto tree = makeTreeWith(file, "#include \"" + include + "\"\n");
    EXPECT_THAT(findBrokenLayers(tree), ElementsAre(file + " includes " + target));
}

INSTANTIATE_TEST_SUITE_P(
    Rules, BrokenLayers,
    testing::Values(Arrow{"host/src/logger.cpp", "error/Result.hpp", "error/Result.hpp"},
                    Arrow{"host/src/logger.cpp", "vclink/git/Guard.hpp",
                          "include/vclink/git/Guard.hpp"},
                    Arrow{"include/vclink/git/Guard.hpp", "error/Result.hpp", "error/Result.hpp"},
                    Arrow{"error/Result.cpp", "util/paths.hpp", "util/paths.hpp"},
                    Arrow{"error/Result.cpp", "options/Callbacks.hpp", "options/Callbacks.hpp"},
                    Arrow{"error/Result.cpp", "../main/Adapter.hpp", "main/Adapter.hpp"},
                    Arrow{"util/paths.hpp", "options/Callbacks.hpp", "options/Callbacks.hpp"},
                    Arrow{"util/paths.hpp", "main/Adapter.hpp", "main/Adapter.hpp"},
                    Arrow{"options/Callbacks.hpp", "util/paths.hpp", "util/paths.hpp"},
                    Arrow{"options/Callbacks.hpp", "main/Adapter.hpp", "main/Adapter.hpp"},
                    Arrow{"main/Adapter.cpp", "support/Command.hpp", "tests/support/Command.hpp"},
                    Arrow{"examples/shell/main.cpp", "main/Adapter.hpp", "main/Adapter.hpp"}),
    nameOf);

class KeptLayers : public testing::TestWithParam<Arrow>
{
};

TEST_P(KeptLayers, PassWithoutAFinding)
{
    const auto &[file, include, target] = GetParam();
    const auto tree = makeTreeWith(file, "#include \"" + include + "\"\n");
    EXPECT_EQ(resolveInclude(tree, file, include), target);
    EXPECT_THAT(findBrokenLayers(tree), IsEmpty());
}

INSTANTIATE_TEST_SUITE_P(
    Rules, KeptLayers,
    testing::Values(
        Arrow{"host/src/logger.cpp", "vclink_host/log.hpp", "host/include/vclink_host/log.hpp"},
        Arrow{"include/vclink/git/Guard.hpp", "fl/ustring.hpp", "host/include/fl/ustring.hpp"},
        Arrow{"include/vclink/git/Guard.hpp", "vclink/git/Error.hpp",
              "include/vclink/git/Error.hpp"},
        Arrow{"error/Result.cpp", "vclink/git/Error.hpp", "include/vclink/git/Error.hpp"},
        Arrow{"util/paths.hpp", "error/Result.hpp", "error/Result.hpp"},
        Arrow{"options/Callbacks.hpp", "error/Result.hpp", "error/Result.hpp"},
        Arrow{"main/Adapter.cpp", "util/paths.hpp", "util/paths.hpp"},
        Arrow{"main/Adapter.cpp", "options/Callbacks.hpp", "options/Callbacks.hpp"},
        Arrow{"main/Adapter.cpp", "Adapter.hpp", "main/Adapter.hpp"},
        Arrow{"tests/support/Command.hpp", "main/Adapter.hpp", "main/Adapter.hpp"},
        Arrow{"examples/shell/main.cpp", "vclink_host/log.hpp",
              "host/include/vclink_host/log.hpp"}),
    nameOf);

TEST(Rooms, IncludeThemselvesAndRoomsThatTheTableGivesThem)
{
    const SourceTree tree{{"util/scope/Owner.hpp", ""},
                          {"util/lock/Copy.hpp", "#include \"util/scope/Owner.hpp\"\n"},
                          {"util/lock/Lock.cpp", "#include \"util/lock/Copy.hpp\"\n"
                                                 "#include \"util/scope/Owner.hpp\"\n"},
                          {"main/files/Adapter.hpp", "#include \"util/lock/Copy.hpp\"\n"},
                          {"main/merge/Merger.hpp", "#include \"main/files/Adapter.hpp\"\n"}};
    EXPECT_THAT(findBrokenRooms(tree), IsEmpty());
}

TEST(Rooms, IncludeNoneAboveAndNoneBeside)
{
    const SourceTree tree{{"util/lock/Lock.hpp", ""},
                          {"util/path/paths.cpp", "#include \"util/lock/Lock.hpp\"\n"},
                          {"util/scope/Owner.cpp", "#include \"../lock/Lock.hpp\"\n"},
                          {"main/merge/Merger.hpp", ""},
                          {"main/files/Adapter.cpp", "#include \"main/merge/Merger.hpp\"\n"}};
    EXPECT_THAT(findBrokenRooms(tree),
                ElementsAre("main/files/Adapter.cpp includes main/merge/Merger.hpp",
                            "util/path/paths.cpp includes util/lock/Lock.hpp",
                            "util/scope/Owner.cpp includes util/lock/Lock.hpp"));
}

TEST(Rooms, AreAllInTheTable)
{
    EXPECT_THAT(findBrokenRooms({{"main/other/Thing.cpp", ""}, {"tests/other/Thing.cpp", ""}}),
                ElementsAre("main/other/Thing.cpp is in a folder that is no room"));
}

TEST(Rooms, HaveNoArrowsThatNobodyNeeds)
{
    const SourceTree tree{{"util/scope/Owner.hpp", ""},
                          {"util/lock/Lock.cpp", "#include \"util/scope/Owner.hpp\"\n"}};
    const auto unused = findUnusedArrows(tree);
    EXPECT_THAT(unused, Contains("util/lock includes nothing of util/repository"));
    EXPECT_THAT(unused, Not(Contains("util/lock includes nothing of util/scope")));
}

TEST(ExportedHeaders, IncludeNothingOfTheLibrariesBelow)
{
    const std::string file = "include/vclink/git/Guard.hpp";
    for (const std::string name :
         {"git2.h", "git2/types.h", "boost/log/trivial.hpp", "boost/process.hpp",
          "boost/outcome.hpp", "boost/filesystem/path.hpp", "unistd.h"})
    {
        EXPECT_THAT(
            findForeignIncludesOfExportedHeaders(makeTreeWith(file, "#include <" + name + ">\n")),
            ElementsAre(file + " includes " + name));
    }
}

TEST(ExportedHeaders, MayIncludeTheHostEachOtherAndPlainValues)
{
    const auto tree =
        makeTreeWith("include/vclink/git/Guard.hpp", "#include <memory>\n#include <cstdint>\n"
                                                     "#include <boost/optional.hpp>\n"
                                                     "#include <boost/optional/optional.hpp>\n"
                                                     "#include <boost/variant/variant.hpp>\n"
                                                     "#include \"fl/ustring.hpp\"\n"
                                                     "#include \"vclink/git/Error.hpp\"\n");
    EXPECT_THAT(findForeignIncludesOfExportedHeaders(tree), IsEmpty());
}

TEST(ExportedHeaders, AreTheOnlyOnesThatAreHeldToIt)
{
    EXPECT_THAT(findForeignIncludesOfExportedHeaders(
                    makeTreeWith("main/Adapter.hpp", "#include <git2.h>\n")),
                IsEmpty());
}

TEST(HostControls, AreNotForTheLibrary)
{
    for (const std::string file : {"include/vclink/git/Guard.hpp", "error/Result.cpp",
                                   "util/paths.hpp", "options/Callbacks.hpp", "main/Adapter.cpp"})
    {
        EXPECT_THAT(findUseOfHostControls(makeTreeWith(file, "#include \"vclink_host/log.hpp\"\n")),
                    ElementsAre(file + " includes vclink_host/log.hpp"));
        EXPECT_THAT(
            findUseOfHostControls(makeTreeWith(file, "#include \"vclink_host/export.hpp\"\n")),
            ElementsAre(file + " includes vclink_host/export.hpp"));
    }
}

TEST(HostControls, GiveTheSdkTheExportMacroOnly)
{
    const std::string file = "host/include/fl/ustring.hpp";
    EXPECT_THAT(findUseOfHostControls(makeTreeWith(file, "#include \"vclink_host/export.hpp\"\n")),
                IsEmpty());
    EXPECT_THAT(findUseOfHostControls(makeTreeWith(file, "#include \"vclink_host/log.hpp\"\n")),
                ElementsAre(file + " includes vclink_host/log.hpp"));
}

TEST(HostControls, AreForTheStandInTheExamplesAndTheTests)
{
    for (const auto *file :
         {"host/src/logger.cpp", "examples/shell/main.cpp", "tests/support/Command.hpp"})
    {
        EXPECT_THAT(findUseOfHostControls(makeTreeWith(file, "#include \"vclink_host/log.hpp\"\n")),
                    IsEmpty());
    }
}

TEST(HeavyLibraries, HaveOneSourceFileEach)
{
    for (const std::string name : {"boost/log/core.hpp", "boost/process/child.hpp",
                                   "boost/process.hpp", "boost/stacktrace.hpp"})
    {
        const std::string include = "#include <" + name + ">\n";
        auto tree = makeTreeWith("host/src/logger.cpp", include);
        EXPECT_THAT(findSpreadHeavyLibraries(tree), IsEmpty());
        tree["main/Adapter.cpp"] = include;
        EXPECT_THAT(
            findSpreadHeavyLibraries(tree),
            ElementsAre("main/Adapter.cpp includes " + name + ", and so does host/src/logger.cpp"));
    }
}

TEST(HeavyLibraries, AreInNoHeader)
{
    const std::string file = "util/paths.hpp";
    EXPECT_THAT(findSpreadHeavyLibraries(makeTreeWith(file, "#  include <boost/log/core.hpp>\n")),
                ElementsAre(file + " includes boost/log/core.hpp, and is a header"));
}

TEST(HeavyLibraries, AreFreeForTestsAndExamples)
{
    auto tree = makeTreeWith("tests/support/Command.hpp", "#include <boost/log/core.hpp>\n");
    tree["examples/shell/main.cpp"] = "#include <boost/log/core.hpp>\n";
    tree["host/tests/LoggerTests.cpp"] = "#include <boost/log/core.hpp>\n";
    EXPECT_THAT(findSpreadHeavyLibraries(tree), IsEmpty());
}

TEST(HeaderProlog, IsTheLicenceAndThePragma)
{
    const std::string file = "util/paths.hpp";
    const std::string licence = "// SPDX-License-Identifier: MIT\n";
    const auto check = [&](const std::string &content) {
        return findHeadersWithoutProlog({{file, content}});
    };
    EXPECT_THAT(check(licence + "#pragma once\n"), IsEmpty());
    EXPECT_THAT(check(licence + "// More.\n\n#pragma once\n"), IsEmpty());
    EXPECT_THAT(check("#pragma once\n" + licence),
                ElementsAre(file + " does not begin with its SPDX line"));
    EXPECT_THAT(check(licence), ElementsAre(file + " has code before #pragma once"));
    EXPECT_THAT(check(licence + "#include <string>\n#pragma once\n"),
                ElementsAre(file + " has code before #pragma once"));
}

TEST(LineMacros, AreNotForTheLibrary)
{
    EXPECT_THAT(findLineMacros(makeTreeWith("error/Result.cpp", "raise(\"x\", __LINE__);\n")),
                ElementsAre("error/Result.cpp uses __LINE__"));
    EXPECT_THAT(findLineMacros(makeTreeWith("host/src/logger.cpp", "__LINE__\n")), IsEmpty());
}

TEST(FileStreams, AreNotForTheLibrary)
{
    EXPECT_THAT(findFileStreams(makeTreeWith("util/lines.cpp", "#include <fstream>\n")),
                ElementsAre("util/lines.cpp includes fstream"));
    EXPECT_THAT(findFileStreams(makeTreeWith("examples/texts.cpp", "#include <fstream>\n")),
                IsEmpty());
}

TEST(LongFiles, AreFound)
{
    EXPECT_THAT(findLongFiles(makeTreeWith("util/lines.cpp", std::string(400, '\n'))),
                ElementsAre("util/lines.cpp has 400 lines"));
    EXPECT_THAT(findLongFiles(makeTreeWith("util/lines.cpp", std::string(399, '\n'))), IsEmpty());
}

} // namespace
