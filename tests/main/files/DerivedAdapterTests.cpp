// SPDX-License-Identifier: MIT
#include <filesystem>
#include <map>
#include <stdexcept>
#include <string>
#include <vector>

#include <boost/filesystem/exception.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "StagingFixture.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using shared_vclink::git::AlreadyAdded;
using shared_vclink::git::Conflicted;
using shared_vclink::git::NoFilesToRemove;
using testing::ElementsAre;
using testing::IsEmpty;
using vclink::FileState;
using vclink::FileStateMap;
using namespace vclink::test;

/// Answers the query for the states of a list by itself.
class AnsweringAdapter : public vclink::git::GitAdapter
{
  public:
    using GitAdapter::GitAdapter;

    FileStateMap getFileStates(const std::vector<upath> &files) override
    {
        std::vector<std::string> &asked = questions.emplace_back();
        for (const auto &file : files)
            asked.push_back(asBytes(file));
        if (fails)
            throw std::logic_error("the query");
        return answer;
    }

    FileStateMap answer;
    bool fails = false;
    std::vector<std::vector<std::string>> questions;
};

/// A class derived from the adapter that overrides the state query.
class DerivedAdapter : public StagingFixture
{
  protected:
    void answer(const std::map<std::string, FileState::State> &states)
    {
        adapter_.answer.clear();
        for (const auto &[name, state] : states)
            adapter_.answer.emplace(files({name}).front(), FileState(state));
    }

    AnsweringAdapter adapter_{asPath(repository_.path()),
                              std::static_pointer_cast<vclink::ApplicationInteractor>(interactor_)};
};

TEST_F(DerivedAdapter, DecidesWhatIsRefusedAndThatNothingIsLeftToDo)
{
    repository_.write("new", "x");
    const NothingChanges nothing(repository_);
    answer({});
    adapter_.addFiles(files({"new"}));
    answer({{"file", FileState::Deleted}});
    EXPECT_THROW(adapter_.removeFiles(files({"file"})), vclink::git::TagException<NoFilesToRemove>);
    answer({{"new", FileState::Clean}, {"other", FileState::Unversioned}});
    expectRefusal<AlreadyAdded>(inRoot({"new"}), [this] { adapter_.addFiles(files({"new"})); });
}

TEST_F(DerivedAdapter, DecidesWhatIsAdded)
{
    repository_.write("file", "edited");
    repository_.write("new", "x");
    answer({{"file", FileState::Unversioned}});
    adapter_.addFiles(files({"new"}));
    EXPECT_THAT(status(), ElementsAre("M  file", "?? new"));
}

TEST_F(DerivedAdapter, DecidesWhatIsRemoved)
{
    answer({{"file", FileState::Deleted}, {"other", FileState::InConflict}});
    adapter_.removeFiles(files({"file", "sub/inside"}));
    EXPECT_THAT(status(), ElementsAre("D  other", "?? other"));
}

TEST_F(DerivedAdapter, DecidesWhatIsInConflict)
{
    repository_.write("file", "edited");
    answer({{"sub/inside", FileState::InConflict},
            {"file", FileState::Modified},
            {"other", FileState::InConflict}});
    const NothingChanges nothing(repository_);
    expectRefusal<Conflicted>(inRoot({"other", "sub/inside"}),
                              [this] { adapter_.revertFiles(files({"file"})); });
}

/// The list, not the answer, says what is reverted.
TEST_F(DerivedAdapter, DecidesThatNothingIsInConflict)
{
    beginMerge({"conflicted"});
    repository_.write("file", "edited");
    answer({{"file", FileState::Clean}});
    adapter_.revertFiles(files({"conflicted"}));
    EXPECT_THAT(status(), ElementsAre(" M file"));
    EXPECT_EQ(repository_.read("conflicted"), "ours\n");
}

TEST_F(DerivedAdapter, MayTellOfFilesThatAreNone)
{
    repository_.write("file", "edited");
    adapter_.answer.emplace(upath(), FileState(FileState::Modified));
    adapter_.answer.emplace(asPath("/"), FileState(FileState::Modified));
    adapter_.answer.emplace(asPath(repository_.path()), FileState(FileState::Modified));
    adapter_.revertFiles(files({"file"}));
    EXPECT_THAT(status(), ElementsAre());
}

TEST_F(DerivedAdapter, IsAskedOnceAboutTheWholeListAlsoAnEmptyOne)
{
    repository_.write("new", "x");
    answer({{"new", FileState::Unversioned}});
    adapter_.addFiles(files({"new", "file"}));
    answer({{"new", FileState::Added}});
    adapter_.removeFiles(files({"other", "new"}));
    answer({});
    adapter_.revertFiles(files({"sub/inside", "file"}));
    adapter_.addFiles({});
    EXPECT_THROW(adapter_.removeFiles({}), vclink::git::TagException<NoFilesToRemove>);
    adapter_.revertFiles({});
    EXPECT_THAT(adapter_.questions,
                ElementsAre(inRoot({"new", "file"}), inRoot({"other", "new"}),
                            inRoot({"sub/inside", "file"}), IsEmpty(), IsEmpty(), IsEmpty()));
}

TEST_F(DerivedAdapter, IsNotAskedWhenAFileIsMarkedAsResolved)
{
    repository_.write("file", "edited");
    adapter_.markResolved(files({"file"}).front());
    EXPECT_THAT(adapter_.questions, IsEmpty());
    EXPECT_THAT(status(), ElementsAre("M  file"));
}

/// Staging opens the root before it looks at the paths, a revert looks at the paths first.
TEST_F(DerivedAdapter, ComesToTheRootAndToThePathsInTurn)
{
    const std::string root = folder() / "no repository";
    std::filesystem::create_directory(root);
    std::filesystem::create_symlink("loop", root + "/loop");
    const upath loop = asPath(root + "/loop");
    AnsweringAdapter adapter(asPath(root),
                             std::static_pointer_cast<vclink::ApplicationInteractor>(interactor_));
    adapter.answer.emplace(loop, FileState(FileState::Unversioned));
    EXPECT_THROW(adapter.addFiles({loop}), vclink::git::LibGit2Exception);
    EXPECT_THROW(adapter.removeFiles({loop}), vclink::git::LibGit2Exception);
    EXPECT_THROW(adapter.revertFiles({loop}), boost::filesystem::filesystem_error);
}

TEST_F(DerivedAdapter, PassesItsOwnExceptionOn)
{
    repository_.write("file", "edited");
    adapter_.fails = true;
    const NothingChanges nothing(repository_);
    EXPECT_THROW(adapter_.addFiles(files({"file"})), std::logic_error);
    EXPECT_THROW(adapter_.removeFiles(files({"file"})), std::logic_error);
    EXPECT_THROW(adapter_.revertFiles(files({"file"})), std::logic_error);
}

} // namespace
