// SPDX-License-Identifier: MIT
#include <algorithm>
#include <iostream>
#include <string>
#include <vector>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <git2.h>

#include "RemoteFixture.hpp"
#include "ServerOfTheSuite.hpp"
#include "WebServer.hpp"
#include "error/logging/severity.hpp"
#include "support/LogCapture.hpp"

namespace
{

using namespace vclink::test;
using Site = WebServer::Site;

class WebTest : public ServerOfTheSuite<WebServer>, public RemoteFixture
{
  protected:
    using ServerOfTheSuite<WebServer>::TearDownTestSuite;
    WebTest()
    {
        auto source = makeRepository("source");
        commit_ = source.commit("first");
        source.git({"push", "--quiet", served_.path(), "HEAD:refs/heads/main"});
    }

    GitRepository served_ = server().makeRepository();
    std::string commit_;
};

class WebPassword : public WebTest, public testing::WithParamInterface<Site>
{
};

TEST_P(WebPassword, IsAskedForInVain)
{
    const std::string url = server().urlAt(GetParam(), served_);
    const LogCapture log(vclink::git::SeverityParameter);
    const auto failure = failureOf([&] { clone(url, "clone"); });
    std::cout << "ends with " << testing::PrintToString(failure) << '\n';
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_EQ(failure.text, "");
    EXPECT_FALSE(std::filesystem::exists(folder() / "clone"));
    const std::string request = " url=" + url + " username_from_url= allowed_types=1";
    const auto messages = log.messages();
    EXPECT_EQ(std::count(messages.begin(), messages.end(), request), 1)
        << "GIT_CREDENTIAL_USERPASS_PLAINTEXT alone, once";
}

/// libgit2 gives no reason; what it has left on its way, of settings that are not set, is none.
TEST_P(WebPassword, AskedForInVainLeavesNoTextOfAnEarlierCall)
{
    auto source = makeRepository("pushing");
    source.commit("second");
    source.git({"remote", "add", "origin", server().urlAt(GetParam(), served_)});
    for (int round = 0; round < 2; ++round)
    {
        for (const auto &failure :
             {failureOf([&] { push(source, {"HEAD:refs/heads/other"}); }),
              failureOf([&] { fetch(source); }), failureOf([&] { heads(source); })})
        {
            EXPECT_EQ(failure.code, GIT_ERROR);
            EXPECT_EQ(failure.errorClass, 0);
            EXPECT_EQ(failure.text, "");
        }
    }
}

TEST_P(WebPassword, InTheAddressIsTakenByLibgit2Itself)
{
    std::string url = server().urlAt(GetParam(), served_);
    url.insert(url.find("//") + 2, WebServer::user() + ":" + WebServer::password() + "@");
    EXPECT_EQ(clone(url, "clone").line({"rev-parse", "HEAD"}), commit_);
}

/// A clone does: libgit2 writes it to the configuration and to the reflogs.
TEST_P(WebPassword, InTheAddressIsNotWrittenByAFetch)
{
    std::string url = server().urlAt(GetParam(), served_);
    url.insert(url.find("//") + 2, WebServer::user() + ":" + WebServer::password() + "@");
    const GitRepository repository = makeRepository("fetching");
    repository.git({"remote", "add", "origin", url});
    fetch(repository);
    EXPECT_EQ(repository.line({"reflog", "--format=%gs", "refs/remotes/origin/main"}),
              "fetch origin");
    EXPECT_THAT(repository.read(".git/FETCH_HEAD"),
                testing::Not(testing::HasSubstr(WebServer::password())));
    const GitRepository made = clone(url, "clone");
    EXPECT_THAT(made.read(".git/logs/refs/remotes/origin/main"),
                testing::HasSubstr(WebServer::password()));
    made.git({"remote", "set-url", "origin", server().urlAt(GetParam(), served_)});
    made.git({"reflog", "expire", "--expire=now", "--all"});
    EXPECT_EQ(
        Command({"grep", "--recursive", "--files-with-matches", WebServer::password(), made.path()})
            .run()
            .output,
        "");
}

INSTANTIATE_TEST_SUITE_P(Sites, WebPassword,
                         testing::Values(Site::HttpWithPassword, Site::HttpsWithPassword),
                         testing::PrintToStringParamName());

/// What the floor's callback is told.
struct Told
{
    std::vector<int> valid;
    std::vector<std::string> hosts;
};

int standAside(git_cert * /*certificate*/, int valid, const char *host, void *payload)
{
    auto &told = *static_cast<Told *>(payload);
    told.valid.push_back(valid);
    told.hosts.emplace_back(host);
    return valid;
}

struct SiteOfCertificate
{
    const char *name;
    Site site;
    /// Whether libgit2 finds the certificate valid, once it trusts the authority.
    bool valid;
};

void PrintTo(const SiteOfCertificate &site, std::ostream *stream)
{
    *stream << site.name;
}

class Certificates : public WebTest, public testing::WithParamInterface<SiteOfCertificate>
{
  protected:
    Certificates()
    {
        // For the life of libgit2, which ends with the test.
        EXPECT_EQ(
            git_libgit2_opts(GIT_OPT_SET_SSL_CERT_LOCATIONS, server().authority().c_str(), nullptr),
            0);
    }

    /// The same clone with libgit2's calls alone and a callback that answers the same.
    int cloneAtTheFloor(Told &told) const
    {
        git_clone_options options;
        git_clone_options_init(&options, GIT_CLONE_OPTIONS_VERSION);
        options.fetch_opts.callbacks.certificate_check = standAside;
        options.fetch_opts.callbacks.payload = &told;
        git_repository *repository = nullptr;
        const int code =
            git_clone(&repository, url_.c_str(), (folder() / "floor").c_str(), &options);
        git_repository_free(repository);
        return code;
    }

    std::string url_ = server().urlAt(GetParam().site, served_);
};

TEST_P(Certificates, DoWithTheLibraryWhatTheyDoWithLibgit2)
{
    Told told;
    EXPECT_EQ(cloneAtTheFloor(told), 0) << git_error_last()->message;

    const LogCapture log(vclink::git::SeverityParameter);
    EXPECT_EQ(clone(url_, "clone").line({"rev-parse", "HEAD"}), commit_);
    std::vector<std::string> records;
    for (const auto &message : log.messages())
    {
        if (message.find(" valid=") == 0)
            records.push_back(message);
    }
    std::vector<std::string> expected;
    for (std::size_t i = 0; i < told.valid.size(); ++i)
        expected.push_back(" valid=" + std::to_string(told.valid[i]) + " host=" + told.hosts[i]);
    EXPECT_FALSE(expected.empty()) << "nobody was asked about the certificate";
    EXPECT_EQ(records, expected);
    EXPECT_EQ(told.valid, std::vector<int>(told.valid.size(), GetParam().valid ? 1 : 0));
    EXPECT_THAT(told.hosts, testing::Each("localhost"));
}

INSTANTIATE_TEST_SUITE_P(
    Are, Certificates,
    testing::Values(SiteOfCertificate{"Valid", Site::Https, true},
                    SiteOfCertificate{"SelfSigned", Site::HttpsSelfSigned, false},
                    SiteOfCertificate{"Expired", Site::HttpsExpired, false},
                    SiteOfCertificate{"OfAnotherHost", Site::HttpsWrongHost, false}),
    [](const auto &instance) { return instance.param.name; });

} // namespace
