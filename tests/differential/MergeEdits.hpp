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

/// Whether a name is that of something in a folder.
bool isIn(const std::string &path, const std::string &folder);
/// Sets a file, and takes away those that can't be beside it: below it, or in the place of a folder
/// that it is in.
void put(Tree &tree, const std::string &path, TreeFile file);

/// Random changes of two trees which are to be merged then. They depend on the random numbers and
/// the trees alone.
class MergeEdits
{
  public:
    explicit MergeEdits(Random &random) : random_(random)
    {
    }

    /// The first tree.
    Tree makeTree();

    static std::size_t kindCount();
    static std::string nameOfKind(std::size_t kind);
    /// Changes both sides in one of the kindCount() ways.
    /// @return false when the trees don't offer what it takes; nothing is changed then
    bool edit(std::size_t kind, Tree &ours, Tree &theirs);
    /// Changes one side somewhere.
    void editSomething(Tree &tree);

  private:
    using Edit = bool (MergeEdits::*)(Tree &one, Tree &other);
    struct Kind
    {
        const char *name;
        Edit edit;
    };
    static const std::vector<Kind> &kinds();

    bool editApart(Tree &one, Tree &other);
    bool editSameLine(Tree &one, Tree &other);
    bool editNeighbours(Tree &one, Tree &other);
    bool insertAtOnePlace(Tree &one, Tree &other);
    bool editAlike(Tree &one, Tree &other);
    bool moveLines(Tree &one, Tree &other);
    bool deleteAgainstEdit(Tree &one, Tree &other);
    bool addAlike(Tree &one, Tree &other);
    bool addDifferently(Tree &one, Tree &other);
    bool addSimilarly(Tree &one, Tree &other);
    bool renameAgainstEdit(Tree &one, Tree &other);
    bool renameAndEditBoth(Tree &one, Tree &other);
    bool renameAlike(Tree &one, Tree &other);
    bool renameApart(Tree &one, Tree &other);
    bool renameAgainstDelete(Tree &one, Tree &other);
    bool renameOntoAdded(Tree &one, Tree &other);
    bool renameTwoOntoOne(Tree &one, Tree &other);
    bool swapNames(Tree &one, Tree &other);
    bool moveFolder(Tree &one, Tree &other);
    bool setModeAgainstEdit(Tree &one, Tree &other);
    bool setModeInConflict(Tree &one, Tree &other);
    bool setModeAgainstDelete(Tree &one, Tree &other);
    bool retargetLinks(Tree &one, Tree &other);
    bool replaceByLinkAgainstEdit(Tree &one, Tree &other);
    bool addLinkAgainstFile(Tree &one, Tree &other);
    bool editBinaryOnce(Tree &one, Tree &other);
    bool editBinaryTwice(Tree &one, Tree &other);
    bool replaceByFolderAgainstEdit(Tree &one, Tree &other);
    bool addFolderAgainstFile(Tree &one, Tree &other);
    bool renameOntoFolder(Tree &one, Tree &other);

    using Selection = std::function<bool(const TreeFile &file)>;
    /// A path of a file that both trees have and for which `isWanted` returns true in both.
    std::optional<std::string> pickCommon(const Tree &one, const Tree &other,
                                          const Selection &isWanted);
    std::optional<std::string> pickText(const Tree &one, const Tree &other);
    /// A path that no tree has had.
    std::string makePath();
    void rename(Tree &tree, const std::string &from, const std::string &to);
    void editTextOf(Tree &tree, const std::string &path, std::size_t third);
    TreeFile makeTextFile();
    static void toggleMode(TreeFile &file);

    Random &random_;
    int names_ = 0;
};

} // namespace vclink::test
