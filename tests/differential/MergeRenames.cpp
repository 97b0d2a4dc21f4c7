// SPDX-License-Identifier: MIT
#include <filesystem>
#include <utility>

#include "MergeEdits.hpp"
#include "listedNames.hpp"

namespace vclink::test
{
namespace
{

std::optional<std::pair<std::string, std::string>> pickTwo(MergeEdits &edits, const Tree &one,
                                                           const Tree &other)
{
    const auto first = edits.pickText(one, other);
    const auto second = edits.pickText(one, other);
    if (!first || first == second)
        return std::nullopt;
    return std::make_pair(*first, *second);
}

bool moveFolder(MergeEdits &edits, Tree &one, Tree &other)
{
    const auto path = edits.pickText(one, other);
    const auto folder = path ? std::filesystem::path(*path).parent_path().string() : std::string();
    if (folder.empty())
        return false;
    const auto number = edits.makeNumber();
    std::vector<std::string> paths;
    for (const auto &[name, file] : one)
    {
        if (isBelow(name, folder))
            paths.push_back(name);
    }
    for (const auto &name : paths)
        MergeEdits::rename(one, name, "moved" + number + name.substr(folder.size()));
    put(other, folder + "/added" + number, edits.makeTextFile());
    edits.editTextOf(other, *path, 1);
    return true;
}

} // namespace

const std::vector<MergeEdits::Kind> renames{
    ofText("a file renamed against edited",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               edits.renameAnyhow(one, path);
               edits.editTextOf(other, path, edits.random.below(3));
           }),
    ofText("a file renamed and edited against edited",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               edits.editTextOf(one, edits.renameAnyhow(one, path), 0);
               edits.editTextOf(other, path, edits.random.chance(50) ? 0 : 2);
           }),
    ofText("a file renamed alike",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               const auto renamed = edits.renameAnyhow(one, path);
               MergeEdits::rename(other, path, renamed);
               edits.editTextOf(one, renamed, 0);
               edits.editTextOf(other, renamed, edits.random.chance(30) ? 0 : 2);
           }),
    ofText("a file renamed twice",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               const auto renamed = edits.renameAnyhow(one, path);
               edits.renameAnyhow(other, path);
               if (edits.random.chance(50))
                   edits.editTextOf(one, renamed, 0);
           }),
    ofText("a file renamed against deleted",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               edits.renameAnyhow(one, path);
               other.erase(path);
           }),
    ofText("a file renamed onto an added one",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               const auto renamed = edits.renameAnyhow(one, path);
               put(other, renamed, edits.makeTextFile());
           }),
    {"two files renamed onto one name",
     [](MergeEdits &edits, Tree &one, Tree &other)
     {
         const auto paths = pickTwo(edits, one, other);
         if (paths)
             MergeEdits::rename(other, paths->second, edits.renameAnyhow(one, paths->first));
         return paths.has_value();
     }},
    {"two names swapped",
     [](MergeEdits &edits, Tree &one, Tree &other)
     {
         const auto paths = pickTwo(edits, one, other);
         if (paths)
         {
             std::swap(one[paths->first], one[paths->second]);
             edits.editTextOf(other, paths->first, edits.random.below(3));
         }
         return paths.has_value();
     }},
    {"a folder moved against a file added to it", &moveFolder},
};

} // namespace vclink::test
