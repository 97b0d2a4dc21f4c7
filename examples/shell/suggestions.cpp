// SPDX-License-Identifier: MIT
#include "suggestions.hpp"

#include <algorithm>
#include <cstddef>
#include <map>
#include <set>
#include <utility>

#include "Command.hpp"
#include "texts.hpp"

namespace vclink::shell
{
namespace
{

/// How many letters have to be changed, put in, taken out or swapped with their neighbour.
std::size_t distance(const std::string &left, const std::string &right)
{
    std::vector<std::vector<std::size_t>> table(left.size() + 1,
                                                std::vector<std::size_t>(right.size() + 1));
    for (std::size_t row = 0; row <= left.size(); ++row)
    {
        for (std::size_t column = 0; column <= right.size(); ++column)
        {
            std::size_t &cell = table[row][column];
            if (row == 0 || column == 0)
            {
                cell = row + column;
                continue;
            }
            const std::size_t change = left[row - 1] == right[column - 1] ? 0 : 1;
            cell = std::min({table[row - 1][column] + 1, table[row][column - 1] + 1,
                             table[row - 1][column - 1] + change});
            if (row > 1 && column > 1 && left[row - 1] == right[column - 2] &&
                left[row - 2] == right[column - 1])
            {
                cell = std::min(cell, table[row - 2][column - 2] + 1);
            }
        }
    }
    return table[left.size()][right.size()];
}

/// "main" for "refs/heads/main", "origin/main" for "refs/remotes/origin/main".
std::string withoutFolder(const std::string &reference)
{
    return reference.substr(reference.find('/', std::string("refs/").size()) + 1);
}

std::string ask(const std::string &word)
{
    return ' ' + say("Did you mean '%1%'?", word);
}

std::string use(const std::string &instead)
{
    return ' ' + say("Use \"%1%\".", instead);
}

std::string onlyGit(const std::string &command)
{
    return ' ' + say("This program does not do that, git does: use \"%1%\".", command);
}

/// Options that people type, and that only git has.
const std::map<std::string, std::set<std::string>> &optionsOfGit()
{
    static const std::map<std::string, std::set<std::string>> options{
        {"add", {"-e", "-f", "-i", "-N", "-n", "-p", "--dry-run", "--force", "--patch"}},
        {"branch",
         {"-c", "-f", "-M", "-m", "-u", "-vv", "--contains", "--edit-description", "--merged",
          "--move", "--no-merged", "--set-upstream-to", "--unset-upstream"}},
        {"clone",
         {"-b", "--bare", "--branch", "--depth", "--filter", "--mirror", "--recurse-submodules",
          "--recursive", "--shallow-since", "--single-branch", "--sparse"}},
        {"commit",
         {"-C", "-c", "-e", "-F", "-p", "-S", "-s", "--amend", "--author", "--date", "--dry-run",
          "--file", "--fixup", "--gpg-sign", "--no-verify", "--patch", "--signoff", "--squash"}},
        {"config",
         {"-e", "-l", "--add", "--edit", "--get", "--global", "--list", "--local", "--system",
          "--unset"}},
        {"fetch",
         {"-p", "-t", "--depth", "--dry-run", "--prune", "--recurse-submodules", "--tags",
          "--unshallow"}},
        {"merge",
         {"-e", "-m", "-s", "-X", "--edit", "--no-commit", "--quit", "--squash", "--strategy"}},
        {"push",
         {"-u", "--all", "--dry-run", "--follow-tags", "--force-with-lease", "--mirror", "--prune",
          "--set-upstream", "--tags"}},
        {"revert", {"-e", "-m", "-n", "--abort", "--continue", "--no-commit", "--no-edit"}},
        {"rm", {"-f", "-n", "--force"}},
        {"status", {"-b", "-sb", "-v", "--branch", "--ignored"}},
        {"switch", {"-C", "-d", "-f", "-m", "--detach", "--force", "--merge", "--orphan"}}};
    return options;
}

} // namespace

std::string suggest(const std::string &word, const std::vector<std::string> &known)
{
    std::string best;
    std::size_t least = std::max<std::size_t>(1, std::min<std::size_t>(2, word.size() / 3)) + 1;
    for (const std::string &candidate : known)
    {
        const std::size_t changes = distance(word, candidate);
        if (changes < least)
        {
            least = changes;
            best = candidate;
        }
    }
    return best.empty() ? best : ask(best);
}

std::string suggestCommand(const std::string &word)
{
    static const std::pair<const char *, const char *> words[] = {
        {"checkout", "switch"}, {"restore", "revert"},      {"reset", "revert"},
        {"ls-remote", "heads"}, {"rev-parse", "rev"},       {"check-attr", "attr"},
        {"remove", "rm"},       {"resolve", "resolved"},    {"st", "status"},
        {"ci", "commit"},       {"symbolic-ref", "current"}};
    static const std::set<std::string> onlyGits{"am",          "apply",
                                                "archive",     "bisect",
                                                "blame",       "cat-file",
                                                "cherry-pick", "clean",
                                                "describe",    "diff",
                                                "difftool",    "format-patch",
                                                "gc",          "grep",
                                                "init",        "log",
                                                "ls-files",    "mergetool",
                                                "mv",          "notes",
                                                "rebase",      "reflog",
                                                "remote",      "shortlog",
                                                "show",        "sparse-checkout",
                                                "stash",       "submodule",
                                                "tag",         "worktree"};
    std::vector<std::string> names;
    for (const CommandEntry &entry : commandTable())
    {
        names.emplace_back(entry.name);
    }
    for (const auto &[gits, ours] : words)
    {
        if (word == gits)
        {
            return ask(ours);
        }
    }
    if (onlyGits.count(word) != 0)
    {
        return onlyGit("git " + word);
    }
    if (word == "pull")
    {
        return use("vclink-shell fetch\", \"vclink-shell merge REMOTE/BRANCH");
    }
    return suggest(word, names);
}

std::string suggestBranch(const git::BranchManager &manager, const std::string &name)
{
    std::vector<std::string> names;
    for (const git::BranchPointer &branch : manager.getRemoteBranches())
    {
        const std::string full = withoutFolder(branch.getName());
        if (full.substr(full.find('/') + 1) == name)
        {
            return ' ' + say("Make it from %1% with \"vclink-shell branch %2% %1%\".", full, name);
        }
        names.push_back(full);
    }
    for (const git::BranchPointer &branch : manager.getLocalBranches())
    {
        names.push_back(withoutFolder(branch.getName()));
    }
    return suggest(name, names);
}

std::string suggestInstead(const std::string &command, const std::string &option)
{
    static const struct
    {
        const char *command;
        const char *option;
        const char *instead;
    } table[] = {{"merge", "--abort", "git merge --abort"},
                 {"merge", "--continue", "vclink-shell commit"},
                 {"merge", "--no-ff", "git config merge.ff false"},
                 {"merge", "--ff-only", "git config merge.ff only"},
                 {"switch", "-c", "vclink-shell branch NAME"},
                 // For a name too many.
                 {"commit", "", "git commit PATH"},
                 {"merge", "", "git merge NAME..."},
                 {"merge", "--no-edit", "vclink-shell merge NAME"},
                 {"add", "-u", "vclink-shell commit"},
                 {"add", "--update", "vclink-shell commit"},
                 {"branch", "-D", "vclink-shell branch -d NAME"},
                 {"branch", "-a", "vclink-shell branches -r"},
                 {"branch", "-r", "vclink-shell branches -r"},
                 {"branch", "--list", "vclink-shell branches"},
                 {"branch", "-v", "vclink-shell branches"},
                 {"branch", "--show-current", "vclink-shell current"},
                 {"push", "--delete", "vclink-shell push REMOTE :BRANCH"},
                 {"push", "-d", "vclink-shell push REMOTE :BRANCH"},
                 {"rm", "-r", "vclink-shell rm PATH"},
                 {"status", "-s", "vclink-shell status"},
                 {"status", "--short", "vclink-shell status"},
                 {"status", "-u", "vclink-shell status"},
                 {"status", "--porcelain", "vclink-shell status -z"},
                 {"switch", "-", "vclink-shell switch NAME"},
                 {"push", "--force", "vclink-shell push REMOTE +BRANCH"},
                 {"push", "-f", "vclink-shell push REMOTE +BRANCH"},
                 {"fetch", "--all", "vclink-shell fetch REMOTE"},
                 {"rm", "--cached", "vclink-shell rm PATH"}};
    for (const auto &row : table)
    {
        if (command == row.command && option == row.option)
        {
            return use(row.instead);
        }
    }
    const auto gits = optionsOfGit().find(command);
    return gits != optionsOfGit().end() && gits->second.count(option) != 0
               ? onlyGit("git " + command + ' ' + option)
               : std::string();
}

} // namespace vclink::shell
