// SPDX-License-Identifier: MIT
// The bridge for every type of callback that libgit2 is given.
#include <cstddef>
#include <sstream>
#include <string>

#include <git2.h>
#include <gtest/gtest.h>

#include "options/Callbacks.hpp"

namespace vclink::git
{
namespace
{

/// Has a member for each type, which writes down what it is called with.
class Everything
{
  public:
    int status(const char *path, unsigned flags)
    {
        return note("status", path, flags);
    }
    int notify(git_checkout_notify_t why, const char *path, const git_diff_file *baseline,
               const git_diff_file *target, const git_diff_file *workdir)
    {
        return note("notify", why, path, baseline->size, target->size, workdir->size);
    }
    void checkoutProgress(const char *path, std::size_t completed, std::size_t total)
    {
        note("checkoutProgress", path, completed, total);
    }
    void perfData(const git_checkout_perfdata *data)
    {
        note("perfData", data->mkdir_calls);
    }
    int sideband(const char *text, int length)
    {
        return note("sideband", text, length);
    }
    int completion(git_remote_completion_t type)
    {
        return note("completion", type);
    }
    int credentials(git_credential **out, const char *url, const char *user, unsigned types)
    {
        return note("credentials", out == nullptr, url, user, types);
    }
    int certificate(git_cert *certificate, int isValid, const char *host)
    {
        return note("certificate", certificate->cert_type, isValid, host);
    }
    int transfer(const git_indexer_progress *progress)
    {
        return note("transfer", progress->total_objects);
    }
    int updateTips(const char *name, const git_oid *from, const git_oid *to)
    {
        return note("updateTips", name, from == nullptr, to == nullptr);
    }
    int packProgress(int stage, unsigned current, unsigned total)
    {
        return note("packProgress", stage, current, total);
    }
    int pushTransfer(unsigned current, unsigned total, std::size_t bytes)
    {
        return note("pushTransfer", current, total, bytes);
    }
    int pushUpdate(const char *name, const char *status)
    {
        return note("pushUpdate", name, status);
    }
    int negotiation(const git_push_update **updates, std::size_t count)
    {
        return note("negotiation", updates == nullptr, count);
    }

    std::string noted;

  private:
    template <class... Values> int note(const char *name, const Values &...values)
    {
        std::ostringstream text;
        text << name;
        ((text << ' ' << values), ...);
        noted = text.str();
        return 11;
    }
};

class CallbackTypes : public testing::Test
{
  protected:
    Everything everything;
};

TEST_F(CallbackTypes, OfACheckoutAreServed)
{
    git_checkout_options record{};
    record.notify_cb = makeCallback<&Everything::notify, git_checkout_notify_cb>();
    record.progress_cb = makeCallback<&Everything::checkoutProgress, git_checkout_progress_cb>();
    record.perfdata_cb = makeCallback<&Everything::perfData, git_checkout_perfdata_cb>();

    git_diff_file files[3] = {};
    files[0].size = 1;
    files[1].size = 2;
    files[2].size = 3;
    EXPECT_EQ(record.notify_cb(GIT_CHECKOUT_NOTIFY_DIRTY, "path", &files[0], &files[1], &files[2],
                               &everything),
              11);
    EXPECT_EQ(everything.noted, "notify 2 path 1 2 3");
    record.progress_cb("path", 4, 5, &everything);
    EXPECT_EQ(everything.noted, "checkoutProgress path 4 5");
    const git_checkout_perfdata data = {6, 7, 8};
    record.perfdata_cb(&data, &everything);
    EXPECT_EQ(everything.noted, "perfData 6");
}

TEST_F(CallbackTypes, OfAStatusWalkAreServed)
{
    const git_status_cb status = makeCallback<&Everything::status, git_status_cb>();
    EXPECT_EQ(status("path", 3, &everything), 11);
    EXPECT_EQ(everything.noted, "status path 3");
}

TEST_F(CallbackTypes, OfAConversationWithARemoteAreServed)
{
    git_remote_callbacks record{};
    record.sideband_progress =
        makeCallback<&Everything::sideband, decltype(record.sideband_progress)>();
    record.completion = makeCallback<&Everything::completion, decltype(record.completion)>();
    record.credentials = makeCallback<&Everything::credentials, decltype(record.credentials)>();
    record.certificate_check =
        makeCallback<&Everything::certificate, decltype(record.certificate_check)>();

    EXPECT_EQ(record.sideband_progress("text", 4, &everything), 11);
    EXPECT_EQ(everything.noted, "sideband text 4");
    EXPECT_EQ(record.completion(GIT_REMOTE_COMPLETION_INDEXING, &everything), 11);
    EXPECT_EQ(everything.noted, "completion 1");
    EXPECT_EQ(record.credentials(nullptr, "url", "user", 3, &everything), 11);
    EXPECT_EQ(everything.noted, "credentials 1 url user 3");
    git_cert certificate = {GIT_CERT_X509};
    EXPECT_EQ(record.certificate_check(&certificate, 1, "host", &everything), 11);
    EXPECT_EQ(everything.noted, "certificate 1 1 host");
}

TEST_F(CallbackTypes, OfATransferAreServed)
{
    git_remote_callbacks record{};
    record.transfer_progress =
        makeCallback<&Everything::transfer, decltype(record.transfer_progress)>();
    record.update_tips = makeCallback<&Everything::updateTips, decltype(record.update_tips)>();
    record.pack_progress =
        makeCallback<&Everything::packProgress, decltype(record.pack_progress)>();

    git_indexer_progress progress = {};
    progress.total_objects = 9;
    EXPECT_EQ(record.transfer_progress(&progress, &everything), 11);
    EXPECT_EQ(everything.noted, "transfer 9");
    const git_oid id = {};
    EXPECT_EQ(record.update_tips("name", nullptr, &id, &everything), 11);
    EXPECT_EQ(everything.noted, "updateTips name 1 0");
    EXPECT_EQ(record.pack_progress(1, 2, 3, &everything), 11);
    EXPECT_EQ(everything.noted, "packProgress 1 2 3");
}

TEST_F(CallbackTypes, OfAPushAreServed)
{
    git_remote_callbacks record{};
    record.push_transfer_progress =
        makeCallback<&Everything::pushTransfer, decltype(record.push_transfer_progress)>();
    record.push_update_reference =
        makeCallback<&Everything::pushUpdate, decltype(record.push_update_reference)>();
    record.push_negotiation =
        makeCallback<&Everything::negotiation, decltype(record.push_negotiation)>();

    EXPECT_EQ(record.push_transfer_progress(4, 5, 6, &everything), 11);
    EXPECT_EQ(everything.noted, "pushTransfer 4 5 6");
    EXPECT_EQ(record.push_update_reference("name", "status", &everything), 11);
    EXPECT_EQ(everything.noted, "pushUpdate name status");
    EXPECT_EQ(record.push_negotiation(nullptr, 7, &everything), 11);
    EXPECT_EQ(everything.noted, "negotiation 1 7");
}

} // namespace
} // namespace vclink::git
