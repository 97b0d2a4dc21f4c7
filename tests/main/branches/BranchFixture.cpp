// SPDX-License-Identifier: MIT
#include "BranchFixture.hpp"

#include "fl/i18n/MessageCatalog.hpp"
#include "fl/i18n/VkLocale.hpp"
#include "support/text.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::test
{

std::string textOf(const resource_core::BaseMsgID &message)
{
    return asUtf8(fl::i18n::MessageCatalog::get_message(message, fl::i18n::VkLocale::global()));
}

std::string textOf(const Failure &failure)
{
    return textOf(
        shared_vclink::git::LibGit2Error(failure.code, failure.errorClass, asUtf16(failure.text)));
}

BranchFixture::BranchFixture()
{
    repository_.identify("Test Person", "person@example.com");
}

std::string BranchFixture::idOf(const std::string &revision) const
{
    return repository_.line({"rev-parse", "--verify", revision});
}

std::string BranchFixture::currentBranch() const
{
    auto lines = split(repository_.tryGit({"symbolic-ref", "--quiet", "HEAD"}).output);
    return lines.empty() ? std::string() : lines.front();
}

std::vector<std::string> BranchFixture::status() const
{
    return split(repository_.git({"status", "--porcelain", "-uall"}));
}

std::vector<std::string> namesOf(const std::vector<git::BranchPointer> &branches)
{
    std::vector<std::string> names;
    for (const auto &branch : branches)
        names.push_back(branch.getName());
    return names;
}

} // namespace vclink::test
