// SPDX-License-Identifier: MIT
#include "suggestions.hpp"

#include <algorithm>
#include <cstddef>
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
        {"checkout", "switch"}, {"restore", "revert"},       {"reset", "revert"},
        {"ls-remote", "heads"}, {"rev-parse", "rev"},        {"check-attr", "attr"},
        {"remove", "rm"},       {"resolve", "resolved"},     {"st", "status"},
        {"ci", "commit"},       {"symbolic-ref", "current"}, {"pull", "fetch"}};
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
                 {"commit", "--amend", "git commit --amend"},
                 {"branch", "-D", "vclink-shell branch -d NAME"},
                 {"branch", "-m", "git branch -m"},
                 {"push", "--force", "vclink-shell push REMOTE +BRANCH"},
                 {"push", "-f", "vclink-shell push REMOTE +BRANCH"},
                 {"fetch", "--all", "vclink-shell fetch REMOTE"},
                 {"rm", "--cached", "vclink-shell rm PATH"}};
    for (const auto &row : table)
    {
        if (command == row.command && option == row.option)
        {
            return ' ' + say("Use \"%1%\".", row.instead);
        }
    }
    return {};
}

} // namespace vclink::shell
