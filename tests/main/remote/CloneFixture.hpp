// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <memory>
#include <string>

#include "RemoteFixture.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace vclink::test
{

/// Base of the fixtures whose tests clone the server, which has some files, to "clone".
class CloneFixture : public RemoteFixture
{
  protected:
    explicit CloneFixture(Naming naming = Naming::FileUrl) : RemoteFixture(naming)
    {
        author_.write("folder/nested", "x");
        author_.write("folder/script", "#!/bin/sh\n");
        author_.setMode("folder/script", 0755);
        author_.symlink("folder/nested", "link");
        publish("gr\xC3\xBC\xC3\x9F", "y");
    }

    void generate(const std::string &specifier, const std::string &target) const
    {
        generator_->generate(asUtf16(specifier), asPath(target));
    }
    void generate() const
    {
        generate(nameOf(server_), clone_.path());
    }
    vclink::WorkingCopyGenerator &generator() const
    {
        return *generator_;
    }
    /// Expects a complete clone of the server, with its default branch checked out.
    void expectCloned(const GitRepository &clone) const
    {
        EXPECT_EQ(idOf("HEAD", clone), idOf("main", author_));
        EXPECT_EQ(clone.line({"symbolic-ref", "HEAD"}), "refs/heads/main");
        EXPECT_EQ(clone.git({"status", "--porcelain"}), "");
        EXPECT_EQ(workingTreeOf(clone), workingTreeOf(author_));
        EXPECT_TRUE(clone.tryGit({"fsck", "--full", "--strict"}).succeeded());
    }

    const GitRepository clone_{folder() / "clone"};

  private:
    const std::unique_ptr<vclink::WorkingCopyGenerator> generator_ =
        git::GitAdapterFactory().createWorkingCopyGenerator(interactor_);
};

} // namespace vclink::test
