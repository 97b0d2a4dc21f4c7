// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "MergeFixture.hpp"
#include "support/NothingLeft.hpp"
#include "support/Scripts.hpp"

namespace vclink::test
{

/// Base of the fixtures whose tests merge as a host does, with a command that takes part: "file" is
/// in conflict between "main" and "topic", and has the driver "tool".
class DrivenMergeFixture : public MergeFixture
{
  protected:
    DrivenMergeFixture()
    {
        repository_.write(".gitattributes", "file merge=tool\n");
        repository_.write("file", "base\n");
        repository_.commitAll("base");
        diverge(writes("file", "ours\n"), writes("file", "theirs\n"));
    }

    void define(const std::string &command) const
    {
        repository_.git({"config", "merge.tool.driver", command});
    }
    /// A script of the shell that is given the ancestor, ours, theirs.
    void defineScript(const std::string &script)
    {
        define(scripts_.shell(script) + " %O %A %B");
    }
    /// Defines one that joins the three sides.
    void defineJoining()
    {
        defineScript("cat \"$1\" \"$3\" >>\"$2\"");
    }
    /// Expects a merge commit with what the joining command has made; then goes back before it.
    void expectJoined() const
    {
        EXPECT_EQ(repository_.git({"cat-file", "blob", "HEAD:file"}), "ours\nbase\ntheirs\n");
        EXPECT_EQ(repository_.read("file"), "ours\nbase\ntheirs\n");
        EXPECT_EQ(parents().size(), 2U);
        EXPECT_EQ(status(), std::vector<std::string>());
        repository_.git({"reset", "--quiet", "--hard", "HEAD^"});
    }

    Scripts scripts_{folder() / "scripts"};
};

} // namespace vclink::test
