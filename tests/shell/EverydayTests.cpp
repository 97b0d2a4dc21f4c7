// SPDX-License-Identifier: MIT
#include <filesystem>
#include <fstream>
#include <map>
#include <ostream>
#include <regex>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "ShellFixture.hpp"
#include "support/readFile.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

/// A line of the script.
struct Step
{
    bool isSetup = false;
    std::string shell;
    std::string git;
    /// why the programs differ; empty if they do not
    std::string difference;
};

struct Scene
{
    std::string title;
    std::vector<Step> steps;
};

void PrintTo(const Scene &scene, std::ostream *stream)
{
    *stream << scene.title;
}

struct Script
{
    std::vector<Scene> scenes;
    std::map<std::string, std::string> differences;
};

std::string cutOff(std::string &text, const std::string &mark)
{
    const std::size_t place = text.find(mark);
    if (place == std::string::npos)
        return {};
    const std::string rest = text.substr(place + mark.size());
    text.erase(place);
    return rest;
}

Step readStep(std::string line)
{
    Step step;
    step.isSetup = line.rfind("$ ", 0) == 0;
    line.erase(0, step.isSetup ? 2 : 0);
    if (step.isSetup)
    {
        step.shell = line;
        return step;
    }
    step.difference = cutOff(line, " ! ");
    const std::string git = cutOff(line, " == ");
    step.shell = line;
    step.git = git.empty() ? line : git;
    return step;
}

Script readScript()
{
    Script script;
    std::ifstream file(VCLINK_EVERYDAY_SCRIPT);
    for (std::string line; std::getline(file, line);)
    {
        const std::string difference = "# differs ";
        if (line.rfind(difference, 0) == 0)
        {
            const std::string reason = cutOff(line, ": ");
            script.differences[line.substr(difference.size())] = reason;
        }
        else if (line.rfind("* ", 0) == 0)
            script.scenes.push_back({line.substr(2), {}});
        else if (!line.empty() && line.front() != '#')
            script.scenes.back().steps.push_back(readStep(line));
    }
    return script;
}

/// A working copy "work" with its remote beside it.
class Twin
{
  public:
    Twin(fs::path folder, std::string program)
        : folder_(std::move(folder)), program_(std::move(program))
    {
        fs::create_directories(folder_);
        runScript(folder_, "git init -q --bare -b main remote.git && git init -q -b main work && "
                           "cd work && git config user.name A && "
                           "git config user.email a@example.org && mkdir dir && "
                           "printf 'a\\n' >a && printf 'b\\n' >b && printf 'c\\n' >dir/c && "
                           "git add . && git commit -q -m Begin && "
                           "git remote add origin ../remote.git && git push -q origin main && "
                           "git fetch -q");
    }

    void prepare(const std::string &script) const
    {
        const CommandResult result = runScript(folder_ / "work", script);
        EXPECT_EQ(result.exitStatus, 0) << script << '\n' << result.errors;
    }

    /// @return the exit status, and what the program wrote to standard error
    CommandResult play(const std::string &words) const
    {
        CommandResult result = runScript(folder_ / "work", program_ + ' ' + words);
        EXPECT_LT(result.exitStatus, 130) << words << '\n' << result.errors;
        return result;
    }

    /// All that the twins have to have in common, without the ids of commits.
    std::string describe() const
    {
        return runScript(folder_ / "work",
                         "git status --porcelain -z -uall; git ls-files --stage -z; "
                         "git symbolic-ref -q HEAD; git log --format='%T %s' HEAD; "
                         "git log --merges --format='merge %T' HEAD; "
                         "git for-each-ref --format='%(refname) %(tree)%(*tree)'; "
                         "git -C ../remote.git for-each-ref --format='remote %(refname) %(tree)'; "
                         "ls .git | grep _HEAD$ | grep -vE 'FETCH_HEAD|ORIG_HEAD'")
                   .output +
               describeFiles();
    }

  private:
    static CommandResult runScript(const fs::path &folder, const std::string &script)
    {
        return Command({"sh", "-c", script})
            .in(folder)
            .environment("GIT_AUTHOR_DATE", "2001-02-03T04:05:06Z")
            .environment("GIT_COMMITTER_DATE", "2001-02-03T04:05:06Z")
            .environment("ASAN_OPTIONS", "detect_leaks=0")
            .run();
    }

    std::string describeFiles() const
    {
        static const std::regex label("(<{7}|>{7}) [^\n]*");
        std::map<std::string, std::string> files;
        for (const char *const place : {"work", "copy"})
        {
            if (!fs::exists(folder_ / place))
                continue;
            for (auto entry = fs::recursive_directory_iterator(folder_ / place);
                 entry != fs::recursive_directory_iterator(); ++entry)
            {
                if (entry->path().filename() == ".git")
                    entry.disable_recursion_pending();
                else if (entry->is_symlink())
                    files[entry->path().lexically_relative(folder_)] =
                        fs::read_symlink(entry->path());
                else if (entry->is_regular_file())
                {
                    files[entry->path().lexically_relative(folder_)] =
                        std::regex_replace(readFile(entry->path()), label, "$1");
                }
            }
        }
        std::string text;
        for (const auto &[name, content] : files)
            text += name + '\n' + content + '\n';
        return text;
    }

    fs::path folder_;
    std::string program_;
};

/// What a status of git is for the program: 129 is wrong usage, all others but 0 are failures.
int translateStatus(int status)
{
    constexpr int wrongUsage = 2;
    constexpr int gitsWrongUsage = 129;
    return status == gitsWrongUsage ? wrongUsage : status == 0 ? 0 : 1;
}

class Everyday : public ShellFixture, public testing::WithParamInterface<Scene>
{
};

TEST_P(Everyday, GoesAsWithGit)
{
    const Script script = readScript();
    const Twin gits(folder() / "git", "git");
    const Twin ours(folder() / "shell", VCLINK_SHELL);
    for (const Step &step : GetParam().steps)
    {
        SCOPED_TRACE(step.shell);
        if (step.isSetup)
        {
            gits.prepare(step.shell);
            ours.prepare(step.shell);
            continue;
        }
        const CommandResult git = gits.play(step.git);
        const CommandResult result = ours.play(step.shell);
        const int expectedStatus = translateStatus(git.exitStatus);
        const std::string expected = gits.describe();
        const std::string state = ours.describe();
        if (step.difference.empty())
        {
            EXPECT_EQ(result.exitStatus, expectedStatus) << result.errors << git.errors;
            ASSERT_EQ(state, expected) << result.errors << git.errors;
            continue;
        }
        EXPECT_EQ(script.differences.count(step.difference), 1U) << step.difference;
        EXPECT_TRUE(result.exitStatus != expectedStatus || state != expected)
            << "There is no difference.";
        if (state != expected)
            break;
    }
}

std::string nameOf(const testing::TestParamInfo<Scene> &info)
{
    std::string name;
    bool isFirst = true;
    for (const char letter : info.param.title)
    {
        const bool isBlank = letter == ' ';
        if (!isBlank)
            name += static_cast<char>(isFirst ? std::toupper(letter) : letter);
        isFirst = isBlank;
    }
    return name;
}

INSTANTIATE_TEST_SUITE_P(Shell, Everyday, testing::ValuesIn(readScript().scenes), nameOf);

TEST(EverydayScript, HasTwoHundredCommandsAndUsesEachDifference)
{
    const Script script = readScript();
    std::map<std::string, int> uses;
    std::size_t commands = 0;
    for (const Scene &scene : script.scenes)
    {
        for (const Step &step : scene.steps)
        {
            commands += step.isSetup ? 0 : 1;
            ++uses[step.difference];
        }
    }
    EXPECT_GE(commands, 200U);
    for (const auto &[key, reason] : script.differences)
        EXPECT_GT(uses[key], 0) << key;
}

} // namespace
} // namespace vclink::test
