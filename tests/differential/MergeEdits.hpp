// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

#include "Random.hpp"

namespace vclink::test
{

/// A file as a tree holds it.
struct TreeFile
{
    /// Git's: "100644", "100755", "120000"
    std::string mode;
    /// its bytes, or a link's target
    std::string content;
};
inline bool operator==(const TreeFile &left, const TreeFile &right)
{
    return left.mode == right.mode && left.content == right.content;
}
bool isLink(const TreeFile &file);
bool isBinary(const TreeFile &file);
bool isLongText(const TreeFile &file);

inline const std::string plainMode = "100644";
inline const std::string executableMode = "100755";
inline const std::string linkMode = "120000";

/// The files of a commit, by path.
using Tree = std::map<std::string, TreeFile>;

/// Sets a file, and takes away those that can't be beside it: below it, or in the place of a folder
/// that it is in.
void put(Tree &tree, const std::string &path, TreeFile file);

/// Random changes of two trees which are to be merged then. They depend on the random numbers and
/// the trees alone.
class MergeEdits
{
  public:
    /// A way to change both sides.
    struct Kind
    {
        std::string name;
        /// @return false when the trees don't offer what it takes; nothing is changed then
        std::function<bool(MergeEdits &edits, Tree &one, Tree &other)> edit;
    };
    static const std::vector<Kind> &kinds();

    explicit MergeEdits(Random &numbers) : random(numbers)
    {
    }

    /// The first tree.
    Tree makeTree();
    /// Changes both sides in one of the ways.
    /// @return false when the trees don't offer what it takes; nothing is changed then
    bool edit(const Kind &kind, Tree &ours, Tree &theirs);
    /// Changes one side somewhere.
    void editSomething(Tree &tree);

    // What the kinds are made of.

    using Selection = std::function<bool(const TreeFile &file)>;
    /// A path of a file that both trees have and for which `isWanted` returns true in both.
    std::optional<std::string> pickCommon(const Tree &one, const Tree &other,
                                          const Selection &isWanted);
    std::optional<std::string> pickText(const Tree &one, const Tree &other);
    /// A path that no tree has had.
    std::string makePath();
    /// A number that no name has had.
    std::string makeNumber();
    static void rename(Tree &tree, const std::string &from, const std::string &to);
    /// As rename(), to a new path.
    /// @return the path
    std::string renameAnyhow(Tree &tree, const std::string &from);
    void editTextOf(Tree &tree, const std::string &path, std::size_t third);
    TreeFile makeTextFile();

    Random &random;

  private:
    int names_ = 0;
};

/// Changes both sides of a text that they have in common.
using TextEdit =
    std::function<void(MergeEdits &edits, Tree &one, Tree &other, const std::string &path)>;
MergeEdits::Kind ofText(const std::string &name, const TextEdit &edit);
void toggleMode(TreeFile &file);

/// The kinds, by what they are about.
extern const std::vector<MergeEdits::Kind> contentEdits;
extern const std::vector<MergeEdits::Kind> renames;
extern const std::vector<MergeEdits::Kind> typeChanges;

} // namespace vclink::test
