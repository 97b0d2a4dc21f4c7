// SPDX-License-Identifier: MIT
#include <atomic>
#include <shared_mutex>
#include <string>
#include <thread>

#include <gtest/gtest.h>

#include "fl/filesystem/path.hpp"
#include "support/GitFixture.hpp"
#include "support/adapterFor.hpp"
#include "support/text.hpp"
#include "vclink/CMAdapter.hpp"

// examples/integrating/guard.cpp
bool probe(std::shared_mutex &guards, const upath &folder);
void mergeAlone(std::shared_mutex &guards, vclink::CMAdapter &adapter, const std::string &name);

namespace
{

using vclink::test::asPath;
using vclink::test::GitRepository;

/// "driven" is merged by a command, which takes their side of what would be in conflict otherwise.
class GuardRecipe : public vclink::test::GitFixture
{
  protected:
    GuardRecipe()
    {
        repository_.git({"config", "user.name", "A"});
        repository_.git({"config", "user.email", "a@example.org"});
        repository_.git({"config", "merge.theirs.driver", "cp %B %A"});
        repository_.write(".gitattributes", "driven merge=theirs\n");
        commitDriven("base\n");
        repository_.git({"checkout", "--quiet", "-b", "other"});
        commitDriven("theirs\n");
        repository_.git({"checkout", "--quiet", "main"});
        before_ = commitDriven("ours\n");
    }
    std::string commitDriven(const std::string &text)
    {
        repository_.write("driven", text);
        return repository_.commitAll(text);
    }

    GitRepository repository_ = makeRepository();
    std::string before_;
    std::shared_mutex guards_;
};

TEST_F(GuardRecipe, FindsWorkingCopies)
{
    EXPECT_TRUE(probe(guards_, asPath(repository_.path())));
    EXPECT_FALSE(probe(guards_, asPath(folder().path())));
}

TEST_F(GuardRecipe, LosesNoCommandThoughAnotherThreadProbes)
{
    const auto adapter = vclink::test::adapterFor(repository_);
    std::atomic<bool> isOver{false};
    std::atomic<int> probes{0};
    std::thread prober(
        [&]
        {
            while (!isOver)
            {
                EXPECT_TRUE(probe(guards_, asPath(repository_.path())));
                ++probes;
            }
        });
    for (int time = 0; time < 25; ++time)
    {
        EXPECT_NO_THROW(mergeAlone(guards_, *adapter, "other"));
        EXPECT_EQ(repository_.read("driven"), "theirs\n");
        repository_.git({"reset", "--quiet", "--hard", before_});
    }
    isOver = true;
    prober.join();
    EXPECT_GT(probes.load(), 25);
}

} // namespace
