// SPDX-License-Identifier: MIT
#include "MergeEdits.hpp"
#include "historyText.hpp"

namespace vclink::test
{
namespace
{

bool addLinkAgainstFile(MergeEdits &edits, Tree &one, Tree &other)
{
    const auto path = edits.makePath() + ".link";
    put(one, path, {linkMode, edits.makePath()});
    put(other, path,
        edits.random.chance(30) ? TreeFile{linkMode, edits.makePath()} : edits.makeTextFile());
    return true;
}

} // namespace

const std::vector<MergeEdits::Kind> typeChanges{
    ofText("a mode changed against edited",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               toggleMode(one[path]);
               edits.editTextOf(other, path, 1);
           }),
    ofText("a mode changed in a conflict",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               toggleMode(one[path]);
               edits.editTextOf(one, path, 1);
               edits.editTextOf(other, path, 1);
           }),
    ofText("a mode changed against deleted",
           [](MergeEdits &, Tree &one, Tree &other, const std::string &path)
           {
               toggleMode(one[path]);
               other.erase(path);
           }),
    {"a link changed twice",
     [](MergeEdits &edits, Tree &one, Tree &other)
     {
         const auto path = edits.pickCommon(one, other, isLink);
         if (!path)
             return addLinkAgainstFile(edits, one, other);
         one[*path].content = edits.makePath();
         if (edits.random.chance(70))
             other[*path].content = edits.makePath();
         return true;
     }},
    ofText("a link for a file against edited",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               one[path] = {linkMode, edits.makePath()};
               edits.editTextOf(other, path, 1);
           }),
    {"a link added against a file", &addLinkAgainstFile},
    {"a binary file edited once",
     [](MergeEdits &edits, Tree &one, Tree &other)
     {
         const auto path = edits.pickCommon(one, other, isBinary);
         if (!path)
         {
             const std::string binary = makeBinary(edits.random);
             put(one, edits.makePath() + ".bin", {plainMode, binary});
             return true;
         }
         one[*path].content = editBinary(edits.random, one[*path].content);
         if (edits.random.chance(40))
             MergeEdits::rename(other, *path, edits.makePath() + ".bin");
         return true;
     }},
    {"a binary file edited twice",
     [](MergeEdits &edits, Tree &one, Tree &other)
     {
         const auto path = edits.pickCommon(one, other, isBinary);
         const auto name = path ? *path : edits.makePath() + ".bin";
         for (auto *tree : {&one, &other})
             put(*tree, name,
                 {plainMode, path ? editBinary(edits.random, (*tree)[name].content)
                                  : makeBinary(edits.random)});
         return true;
     }},
    ofText("a folder for a file against edited",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               put(one, path + "/inner", edits.makeTextFile());
               edits.editTextOf(other, path, 1);
           }),
    {"a folder added against a file",
     [](MergeEdits &edits, Tree &one, Tree &other)
     {
         const auto path = edits.makePath();
         put(one, path + "/inner", edits.makeTextFile());
         put(other, path, edits.makeTextFile());
         return true;
     }},
    ofText("a file renamed onto a folder",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               const auto renamed = edits.renameAnyhow(one, path);
               put(other, renamed + "/inner", edits.makeTextFile());
           }),
};

} // namespace vclink::test
