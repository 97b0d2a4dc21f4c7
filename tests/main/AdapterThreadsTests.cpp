// SPDX-License-Identifier: MIT
#include <future>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "AdapterFixture.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/LibGit2Exception.hpp"

namespace
{

using vclink::git::GitAdapterFactory;
using vclink::git::LibGit2Exception;
using namespace vclink::test;

constexpr int rounds = 50;
constexpr int threads = 4;

class AdapterThreads : public AdapterFixture
{
  protected:
    /// Runs the action on several threads at once, each with its number.
    /// @return how many threads saw something wrong
    template <class Action> static int countWrong(Action action)
    {
        std::vector<std::future<bool>> running;
        for (int number = 0; number < threads; ++number)
            running.push_back(std::async(std::launch::async, action, number));
        int wrong = 0;
        for (auto &thread : running)
            wrong += thread.get() ? 0 : 1;
        return wrong;
    }

    GitRepository repositoryNumber(int number) const
    {
        auto repository = makeRepository("repository" + std::to_string(number));
        for (int i = 0; i <= number; ++i)
            repository.write("file" + std::to_string(i), "x");
        return repository;
    }
};

/// Each of its own repository, and all of one.
TEST_F(AdapterThreads, HaveAdaptersOfSeveralRepositoriesOrOfOne)
{
    std::vector<GitRepository> repositories;
    for (int number = 0; number < threads; ++number)
        repositories.push_back(repositoryNumber(number));
    const auto countStates = [&](std::size_t number)
    {
        const upath root = asPath(repositories[number].path());
        const auto adapter = GitAdapterFactory().createAdapterFor(root, interactor_);
        for (int i = 0; i < rounds; ++i)
        {
            if (adapter->getFolderStates(root).size() != number + 1)
                return false;
        }
        return true;
    };
    EXPECT_EQ(countWrong([&](int number) { return countStates(static_cast<std::size_t>(number)); }),
              0);
    EXPECT_EQ(countWrong([&](int) { return countStates(threads - 1); }), 0);
}

TEST_F(AdapterThreads, StartAndEndLibGit2AtOnce)
{
    const GitRepository repository = repositoryNumber(0);
    const upath root = asPath(repository.path());
    const upath missing = asPath(folder() / "missing");
    const auto query = [&](int number)
    {
        const GitAdapterFactory factory;
        for (int i = 0; i < rounds; ++i)
        {
            const bool expected = (i + number) % 2 == 0;
            if (factory.isAdapterFor(expected ? root : missing) != expected)
                return false;
            const auto adapter = factory.createAdapterFor(root, interactor_);
            if (adapter->getFileStates({asPath(repository / "file0")}).size() != 1)
                return false;
        }
        return true;
    };
    EXPECT_EQ(countWrong(query), 0);
}

TEST_F(AdapterThreads, RaiseEachItsOwnFailure)
{
    const auto query = [&](int number)
    {
        const std::string root = folder() / ("missing" + std::to_string(number));
        const auto adapter = makeAdapter(root);
        for (int i = 0; i < rounds; ++i)
        {
            try
            {
                adapter->getFolderStates(asPath(root));
                return false;
            }
            catch (const LibGit2Exception &exception)
            {
                const auto text = asUtf8(exception.getError().getMessage());
                if (text.find(root + '\'') == std::string::npos)
                    return false;
            }
        }
        return true;
    };
    EXPECT_EQ(countWrong(query), 0);
}

} // namespace
