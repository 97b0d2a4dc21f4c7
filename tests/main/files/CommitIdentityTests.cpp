// SPDX-License-Identifier: MIT
#include <array>
#include <cstdlib>
#include <ctime>
#include <optional>
#include <string>
#include <typeinfo>
#include <utility>

#include <git2.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include "CommitFixture.hpp"
#include "support/Sentence.hpp"
#include "support/libgit2Release.hpp"

namespace
{

using shared_vclink::git::NoUserName;
using namespace vclink::test;

using NoUserNameException = vclink::git::TagException<NoUserName>;

const Failure emptyIdentity{GIT_ERROR, GIT_ERROR_INVALID,
                            "failed to parse signature - Signature cannot have an empty name or "
                            "email"};
const Failure angleBrackets{GIT_ERROR, GIT_ERROR_INVALID,
                            "failed to parse signature - Neither `name` nor `email` should contain "
                            "angle brackets chars."};

const std::string noise(libgit2_release::noiseOfNames);

std::string hostName()
{
    std::array<char, 1024> name{};
    EXPECT_EQ(::gethostname(name.data(), name.size()), 0);
    return name.data();
}

void setVariable(const char *name, const std::string &value)
{
    ::setenv(name, value.c_str(), 1);
}

/// Sets the local time zone for a while.
class TimeZone
{
  public:
    explicit TimeZone(const std::string &zone)
    {
        setVariable("TZ", zone);
        ::tzset();
    }
    TimeZone(const TimeZone &) = delete;
    TimeZone &operator=(const TimeZone &) = delete;
    ~TimeZone()
    {
        ::unsetenv("TZ");
        ::tzset();
    }
};

/// The tests start with neither a name nor an address configured, and no variable set.
class CommitIdentity : public CommitFixture
{
  protected:
    CommitIdentity()
    {
        repository_.git({"config", "--remove-section", "user"});
        repository_.write("file", "changed\n");
        repository_.remove("other");
    }

    void configure(const std::string &key, const std::string &value) const
    {
        repository_.git({"config", key, value});
    }
    /// "name <address>" of the author of a commit, which is the committer too.
    std::string identityAfterCommit() const
    {
        commit();
        const std::string author = repository_.line({"log", "-1", "--format=%an <%ae> %at"});
        EXPECT_EQ(author, repository_.line({"log", "-1", "--format=%cn <%ce> %ct"}));
        return author.substr(0, author.rfind(' '));
    }
    void expectFailure(const Failure &failure) const
    {
        const NothingChanges nothing(repository_);
        EXPECT_EQ(failureOf([this] { commit(); }), failure);
    }
};

/// Variables and settings, where they are set, and whom a commit is by, or why it fails.
struct Person : Sentence
{
    std::optional<std::string> user;
    std::optional<std::string> logName;
    std::optional<std::string> name;
    std::optional<std::string> address;
    std::string identity;
    Failure failure = {};
};

class CommittingPerson : public CommitIdentity, public testing::WithParamInterface<Person>
{
  protected:
    CommittingPerson()
    {
        if (GetParam().user)
            setVariable("USER", *GetParam().user);
        if (GetParam().logName)
            setVariable("LOGNAME", *GetParam().logName);
        if (GetParam().name)
            configure("user.name", *GetParam().name);
        if (GetParam().address)
            configure("user.email", *GetParam().address);
    }
};

using IdentifiedPerson = CommittingPerson;

TEST_P(IdentifiedPerson, IsInTheCommitAndTheReflog)
{
    std::string expected = GetParam().identity;
    if (expected.back() == '@')
        expected = expected.substr(0, expected.size() - 1) + '@' + hostName();
    EXPECT_EQ(identityAfterCommit(), expected + '>');
    EXPECT_EQ(repository_.line({"log", "--walk-reflogs", "-1", "--format=%gn <%ge>"}),
              expected + '>');
}

/// An identity that ends in an at sign is followed by the host name.
const Person identifiedPersons[]{
    {{"Configured"},
     "builder",
     "builder",
     "Ann O'Neill",
     "ann@example.com",
     "Ann O'Neill <ann@example.com"},
    {{"ConfiguredWithoutVariables"}, {}, {}, "Ann", "ann@example.com", "Ann <ann@example.com"},
    {{"OfTheUserVariable"}, "builder", {}, {}, {}, "builder <builder@"},
    {{"OfTheUserVariableBesideAName"}, "builder", {}, "Ann", {}, "builder <builder@"},
    {{"OfTheUserVariableBesideAnAddress"},
     "builder",
     {},
     {},
     "ann@example.com",
     "builder <builder@"},
    {{"OfTheUserVariableBesideTheLogName"}, "builder", "logger", {}, {}, "builder <builder@"},
    {{"OfTheLogName"}, {}, "logger", {}, {}, "logger <logger@"},
    {{"OfANameThatIsNoAscii"}, "J\xC3\xBCrg", {}, {}, {}, "J\xC3\xBCrg <J\xC3\xBCrg@"},
    // The name of the address is as it was; libgit2 cuts what it takes for noise at the ends.
    {{"OfANameWithNoise"},
     " the builder" + noise + ' ',
     {},
     {},
     {},
     "the builder <the builder" + noise + " @"},
};

INSTANTIATE_TEST_SUITE_P(The, IdentifiedPerson, testing::ValuesIn(identifiedPersons),
                         testing::PrintToStringParamName());

using RefusedPerson = CommittingPerson;

TEST_P(RefusedPerson, ChangesNothing)
{
    expectFailure(GetParam().failure);
}

const Person refusedPersons[]{
    {{"WithAnEmptyUserAlsoBesideALogName"}, "", "logger", {}, {}, "", emptyIdentity},
    {{"WithAnEmptyLogName"}, {}, "", {}, {}, "", emptyIdentity},
    {{"WithAnEmptyName"}, "builder", {}, "", "ann@example.com", "", emptyIdentity},
    {{"WithABlankName"}, "builder", {}, "   ", "ann@example.com", "", emptyIdentity},
    {{"WithANameOfNoise"}, "builder", {}, noise, "ann@example.com", "", emptyIdentity},
    {{"WithAnEmptyAddress"}, "builder", {}, "Ann", "", "", emptyIdentity},
    {{"WithAngleBracketsInTheName"},
     "builder",
     {},
     "Ann <ann@example.com>",
     "ann@example.com",
     "",
     angleBrackets},
    {{"WithAngleBracketsInTheUser"}, "<builder>", {}, {}, {}, "", angleBrackets},
};

INSTANTIATE_TEST_SUITE_P(The, RefusedPerson, testing::ValuesIn(refusedPersons),
                         testing::PrintToStringParamName());

TEST_F(CommitIdentity, IsTheRepositorysOwnOverTheGlobalOne)
{
    GitRepository(environment().home())
        .write(".gitconfig", "[user]\n\tname = Global\n\temail = global@example.com\n");
    configure("user.name", "Local");
    EXPECT_EQ(identityAfterCommit(), "Local <global@example.com>");
    configure("user.email", "local@example.com");
    EXPECT_EQ(identityAfterCommit(), "Local <local@example.com>");
}

/// git itself would follow these.
TEST_F(CommitIdentity, IsNotTakenFromGitsOwnVariables)
{
    configure("user.name", "Ann");
    configure("user.email", "ann@example.com");
    configure("author.name", "Author");
    configure("committer.email", "committer@example.com");
    for (const auto *name : {"GIT_AUTHOR_NAME", "GIT_AUTHOR_EMAIL", "GIT_COMMITTER_NAME",
                             "GIT_COMMITTER_EMAIL", "EMAIL"})
        setVariable(name, "variable");
    setVariable("GIT_AUTHOR_DATE", "1577836800 +0000");
    EXPECT_EQ(identityAfterCommit(), "Ann <ann@example.com>");
    EXPECT_NE(repository_.line({"log", "-1", "--format=%at"}), "1577836800");
}

TEST_F(CommitIdentity, OfNobodyIsRefusedByAMessageOfItsOwn)
{
    const NothingChanges nothing(repository_);
    try
    {
        commit();
        ADD_FAILURE() << "no exception";
    }
    catch (const NoUserNameException &exception)
    {
        const vclink::exception::SourceControlException &base = exception;
        EXPECT_EQ(typeid(base), typeid(NoUserNameException));
        EXPECT_EQ(exception.GetID(), "shared_vclink:git:NoUserName");
        EXPECT_EQ(exception.GetBaseMsgIDObj().getCatalogue(), "shared_vclink:git");
        EXPECT_EQ(exception.GetBaseMsgIDObj().getKey(), "NoUserName");
        EXPECT_TRUE(exception.GetBaseMsgIDObj().getArguments().empty());
    }
}

TEST_F(CommitIdentity, OfNobodyIsRefusedAlsoWithOneHalfAndInAnEmptyRepository)
{
    for (const std::string key : {"user.name", "user.email"})
    {
        configure(key, "ann@example.com");
        const NothingChanges nothing(repository_);
        EXPECT_THROW(commit(), NoUserNameException) << key;
        repository_.git({"config", "--unset", key});
    }
    const auto empty = makeRepository("empty");
    empty.write("added", "x");
    empty.add({"added"});
    const NothingChanges nothing(empty);
    EXPECT_THROW(commitIn(empty), NoUserNameException);
}

TEST_F(CommitIdentity, FailsWithAConfigurationThatCannotBeRead)
{
    setVariable("USER", "builder");
    const NothingChanges nothing(repository_);
    const GitRepository home(environment().home());
    home.write(".gitconfig", "[user\n");
    const Failure failure = failureOf([this] { commit(); });
    EXPECT_EQ(failure.code, GIT_ERROR);
    EXPECT_EQ(failure.errorClass, GIT_ERROR_CONFIG);
    home.remove(".gitconfig");
}

TEST_F(CommitIdentity, HasTheCurrentTimeInTheLocalZone)
{
    setVariable("USER", "builder");
    for (const auto &[zone, offset] : {std::pair{"EAST-05:30", " +0530"}, {"WEST+08:00", " -0800"}})
    {
        const TimeZone local(zone);
        const std::time_t before = std::time(nullptr);
        commit();
        const std::time_t after = std::time(nullptr);
        for (const std::string kind : {"author", "committer"})
        {
            const std::string bytes = repository_.git({"cat-file", "commit", "HEAD"});
            const std::string beginning = '\n' + kind + " builder <builder@" + hostName() + "> ";
            const auto begin = bytes.find(beginning);
            ASSERT_NE(begin, std::string::npos) << bytes;
            const std::string when = bytes.substr(begin + beginning.size(), 16);
            EXPECT_EQ(when.substr(10), offset);
            EXPECT_GE(std::stoll(when), before);
            EXPECT_LE(std::stoll(when), after);
        }
    }
}

} // namespace
