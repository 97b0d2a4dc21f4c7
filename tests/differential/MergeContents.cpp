// SPDX-License-Identifier: MIT
#include "MergeEdits.hpp"
#include "historyText.hpp"

namespace vclink::test
{

const std::vector<MergeEdits::Kind> contentEdits{
    ofText("texts edited apart",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               edits.editTextOf(one, path, 0);
               edits.editTextOf(other, path, 2);
           }),
    ofText("one line edited twice",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               const auto line = edits.random.below(12);
               for (auto *tree : {&one, &other})
               {
                   auto &content = (*tree)[path].content;
                   content = replaceLine(content, line, makeUniqueLine(edits.random));
               }
           }),
    ofText("neighbouring lines edited",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               const auto line = edits.random.below(8);
               auto &content = one[path].content;
               auto &otherContent = other[path].content;
               content = replaceLine(content, line, makeUniqueLine(edits.random));
               const std::string otherText = makeUniqueLine(edits.random);
               const auto otherLine = line + 1 + edits.random.below(3);
               otherContent = replaceLine(otherContent, otherLine, otherText);
           }),
    ofText("lines inserted at one place",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               const auto line = edits.random.below(12);
               for (auto *tree : {&one, &other})
               {
                   auto &content = (*tree)[path].content;
                   content = insertLine(content, line, makeUniqueLine(edits.random));
               }
           }),
    ofText("a text edited alike",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               edits.editTextOf(one, path, 1);
               other[path] = one[path];
               edits.editTextOf(other, path, 1);
           }),
    ofText("lines moved against edited",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               one[path].content = moveBlock(edits.random, one[path].content);
               edits.editTextOf(other, path, edits.random.below(2));
           }),
    ofText("a file deleted against edited",
           [](MergeEdits &edits, Tree &one, Tree &other, const std::string &path)
           {
               one.erase(path);
               edits.editTextOf(other, path, 1);
           }),
    {"a file added alike",
     [](MergeEdits &edits, Tree &one, Tree &other)
     {
         const auto path = edits.makePath();
         const auto file = edits.makeTextFile();
         put(one, path, file);
         put(other, path, file);
         return true;
     }},
    {"a file added differently",
     [](MergeEdits &edits, Tree &one, Tree &other)
     {
         const auto path = edits.makePath();
         put(one, path, edits.makeTextFile());
         put(other, path, edits.makeTextFile());
         return true;
     }},
    {"a file added similarly",
     [](MergeEdits &edits, Tree &one, Tree &other)
     {
         const auto path = edits.makePath();
         put(one, path, edits.makeTextFile());
         put(other, path, one[path]);
         edits.editTextOf(one, path, 0);
         edits.editTextOf(other, path, edits.random.below(3));
         if (edits.random.chance(30))
             toggleMode(one[path]);
         return true;
     }},
};

} // namespace vclink::test
