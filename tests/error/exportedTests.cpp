// SPDX-License-Identifier: MIT
// Failures as a host meets them: out of the shared library, by its exported headers only.
#include <exception>
#include <filesystem>
#include <fstream>
#include <memory>
#include <set>
#include <string>
#include <typeinfo>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "error/exceptions.hpp"
#include "error/raiser.hpp"
#include "fl/filesystem/path.hpp"
#include "fl/i18n/convert.hpp"
#include "foundation/core/except/Exception.hpp"
#include "support/GitFixture.hpp"
#include "support/LocaleOfTheProcess.hpp"
#include "support/LogCapture.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/exception/SourceControlException.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/GitOptionsFactory.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace
{

using foundation::core::except::IMsgIDException;
using foundation::core::except::IUserException;
using shared_vclink::git::AlreadyAdded;
using shared_vclink::git::HasConflicts;
using testing::HasSubstr;
using vclink::exception::SourceControlException;
using vclink::git::GitAdapterFactory;
using vclink::git::GitException;
using vclink::git::LibGit2Exception;
using vclink::test::LogCapture;
using vclink::test::TestInteractor;

template <class Tag>
using TagException = foundation::core::except::Exception<Tag, SourceControlException>;

class Exported : public vclink::test::GitFixture
{
  protected:
    /// A folder that says of itself that it is a working copy, and is none.
    upath brokenFolder() const
    {
        const std::filesystem::path path = folder() / "broken";
        std::filesystem::create_directory(path);
        std::ofstream(path / ".git") << "no link to a repository\n";
        return vclink::test::asPath(path);
    }

    GitAdapterFactory factory;
};

TEST_F(Exported, FailureOfAProbeIsCaughtAsEachOfItsClasses)
{
    vclink::test::expectCaughtAs<LibGit2Exception, GitException, IMsgIDException, IUserException,
                                 SourceControlException, boost::exception, std::exception>(
        [this, broken = brokenFolder()] { factory.isAdapterFor(broken); });
}

TEST_F(Exported, FailureTellsWhatLibGit2Said)
{
    try
    {
        factory.isAdapterFor(brokenFolder());
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const IUserException &exception)
    {
        ASSERT_EQ(typeid(exception), typeid(LibGit2Exception));
        const auto &failure = dynamic_cast<const LibGit2Exception &>(exception);
        EXPECT_LT(failure.getError().getCode(), 0);
        const ustring words = failure.getError().getMessage();
        ASSERT_FALSE(words.empty());
        EXPECT_NE(failure.GetUnicodeMessageTxt().find(words), ustring::npos);
        EXPECT_EQ(failure.GetBaseMsgIDObj().getKey(), "LibGit2Error");
        EXPECT_GT(failure.getStackTrace().size(), 0u);
    }
}

TEST_F(Exported, FailureIsToldInTheLocaleOfTheMomentOfAsking)
{
    std::unique_ptr<const GitException> failure;
    try
    {
        factory.isAdapterFor(brokenFolder());
    }
    catch (const GitException &exception)
    {
        failure.reset(exception.clone());
    }
    ASSERT_NE(failure, nullptr);
    const GitException &kept = *failure;
    EXPECT_EQ(typeid(kept), typeid(LibGit2Exception));
    std::set<ustring> texts;
    for (const char *const language : {"de", "ja", "en"})
    {
        const vclink::test::LocaleOfTheProcess locale(language);
        texts.insert(failure->GetUnicodeMessageTxt());
        EXPECT_EQ(failure->what(), fl::i18n::to_string(failure->GetUnicodeMessageTxt()));
    }
    EXPECT_EQ(texts.size(), 3U);
}

TEST_F(Exported, FailureOfAnAdapterIsCaughtByItsClass)
{
    const auto interactor = std::make_shared<TestInteractor>();
    const auto adapter =
        factory.createAdapterFor(vclink::test::asPath(folder().path()), interactor);
    EXPECT_THROW(adapter->getFolderStates(adapter->getRootFolder()), LibGit2Exception);
}

TEST_F(Exported, LibraryLogsUnderItsNameToTheHostsSinks)
{
    const LogCapture log(0x20 | 0x08 | 0x40);
    EXPECT_THROW(factory.isAdapterFor(brokenFolder()), LibGit2Exception);
    const auto records = log.records();
    ASSERT_EQ(records.size(), 4u);
    EXPECT_THAT(records[0].message, HasSubstr("GitErrorPolicy::throwIfError"));
    EXPECT_THAT(records[1].message, testing::StartsWith("Throwing error "));
    EXPECT_THAT(records[2].message, testing::EndsWith(" [throw]"));
    // The probe's guard ends.
    EXPECT_EQ(records[3].message, "Unregister merge driver: *");
}

TEST_F(Exported, TagExceptionIsCaughtByItsIdentifierAndAsAFailureOfSourceControl)
{
    const auto raise = [] { vclink::test::raiseAlreadyAdded(u"a\nb"); };
    vclink::test::expectCaughtAs<SourceControlException, IMsgIDException, boost::exception>(raise);
    try
    {
        raise();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const TagException<HasConflicts> &)
    {
        ADD_FAILURE() << "caught by another identifier";
    }
    catch (const TagException<AlreadyAdded> &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(TagException<AlreadyAdded>));
        EXPECT_EQ(exception.GetBaseMsgIDObj().getKey(), "AlreadyAdded");
        EXPECT_NE(exception.GetUnicodeMessageTxt().find(u"a\nb"), ustring::npos);
    }
}

TEST_F(Exported, NestedTagExceptionGivesItsCause)
{
    try
    {
        vclink::test::raiseHasConflictsWhileHandling(42);
    }
    catch (const TagException<HasConflicts> &exception)
    {
        try
        {
            std::rethrow_if_nested(exception);
            ADD_FAILURE() << "nothing is nested";
        }
        catch (int cause)
        {
            EXPECT_EQ(cause, 42);
        }
    }
}

struct OwnFactory : vclink::git::GitOptionsFactory
{
    using GitOptionsFactory::GitOptionsFactory;
    MOCK_METHOD(vclink::git::CloneOptions, makeCloneOptions, (), (override));
    MOCK_METHOD(vclink::git::FetchOptions, makeFetchOptions, (), (override));
    MOCK_METHOD(vclink::git::ProxyOptions, makeProxyOptions, (), (override));
    MOCK_METHOD(vclink::git::PushOptions, makePushOptions, (), (override));
    MOCK_METHOD(vclink::git::CheckoutOptions, makeCheckoutOptions, (), (override));
    MOCK_METHOD(vclink::git::StatusOptions, makeStatusOptions, (), (override));
    MOCK_METHOD(vclink::git::MergeOptions, makeMergeOptions, (), (override));
};

TEST_F(Exported, OptionsFactoryCanBeMadeAndBeDerivedFrom)
{
    const auto interactor = std::make_shared<TestInteractor>();
    testing::NiceMock<OwnFactory> own(interactor);
    EXPECT_EQ(own.getInteractor(), interactor);
    const auto given = vclink::git::GitOptionsFactory::makeUninitialized(interactor);
    EXPECT_EQ(given->makePushOptions().packbuilderParallelism,
              own.makePushOptions().packbuilderParallelism);
}

} // namespace
