// SPDX-License-Identifier: MIT
// The pieces of docs/integrating.md, which scripts/docs compares with this file.
#include <exception>
#include <functional>
#include <iostream>
#include <memory>
#include <optional>
#include <shared_mutex>
#include <string>
#include <utility>

#include <boost/core/null_deleter.hpp>
#include <boost/log/core.hpp>
#include <boost/log/expressions.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/log/sinks/text_ostream_backend.hpp>
#include <boost/log/utility/exception_handler.hpp>
#include <boost/make_shared.hpp>

#include "fl/i18n/VkLocale.hpp"
#include "fl/i18n/convert.hpp"
#include "foundation/core/except/Exception.hpp"
#include "foundation/core/except/IUserException.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/exception/SourceControlException.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/GitRemote.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/git/LibGit2Guard.hpp"
#include "vclink/git/messageIdentifiers.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"
#include "vclink_host/cancellation.hpp"
#include "vclink_host/locale.hpp"
#include "vclink_host/logging.hpp"

namespace integrating
{

// What a host shows to its user.
void showProgress(double fraction);
void showStep(const std::string &text);
void showCancelled();
void showFailure(const std::string &text);
void offerToResolve();

class Progress : public vclink::ProgressReporter
{
  public:
    void setProgress(double fraction) override
    {
        showProgress(fraction);
    }
    void setProgressMessage(const ustring &message) override
    {
        showStep(fl::i18n::ustring_to_utf8(message));
    }
};

class Interactor : public vclink::ApplicationInteractor
{
  public:
    vclink::Terminator &getTerminator() override
    {
        return terminator_;
    }
    vclink::ProgressReporter *getProgressReporter() override
    {
        return &progress_;
    }

  private:
    vclink::Terminator terminator_;
    Progress progress_;
};

void fetchAndMerge(const upath &folder, const std::shared_ptr<Interactor> &interactor)
{
    const vclink::git::GitAdapterFactory factory;
    const auto adapter = factory.createAdapterFor(folder, interactor);
    const auto remote = vclink::git::GitRemote::create("origin", *adapter);
    const auto branches = vclink::git::BranchManager::create(*adapter);
    remote->fetch({});
    branches->merge("origin/main");
}

/// One for the process.
std::shared_mutex &guardMutex();

bool probe(const upath &folder)
{
    const std::shared_lock<std::shared_mutex> lock(guardMutex());
    return vclink::git::GitAdapterFactory().isAdapterFor(folder);
}

void mergeAlone(vclink::CMAdapter &adapter, const std::string &name)
{
    const std::unique_lock<std::shared_mutex> lock(guardMutex());
    const vclink::git::LibGit2Guard guard;
    vclink::git::BranchManager::create(adapter)->merge(name);
}

void cancel(Interactor &interactor)
{
    vclink_host::requestCancellation(interactor.getTerminator());
}

void run(const std::function<void()> &operation)
{
    using AlreadyAdded =
        foundation::core::except::Exception<shared_vclink::git::AlreadyAdded,
                                            vclink::exception::SourceControlException>;
    try
    {
        operation();
    }
    catch (const vclink::util::exception::CancelledOperationException &)
    {
        showCancelled();
    }
    catch (const AlreadyAdded &)
    {
        // Nothing was added, and nothing is left to do.
    }
    catch (const vclink::git::LibGit2Exception &failure)
    {
        std::clog << "libgit2's code " << failure.getError().getCode() << '\n';
        showFailure(fl::i18n::ustring_to_utf8(failure.GetUnicodeMessageTxt()));
    }
    catch (const foundation::core::except::IUserException &failure)
    {
        showFailure(fl::i18n::ustring_to_utf8(failure.GetUnicodeMessageTxt()));
    }
    catch (const std::exception &failure)
    {
        showFailure(failure.what());
    }
}

void mergeTopic(vclink::git::BranchManager &branches)
{
    try
    {
        branches.merge("topic");
    }
    catch (const vclink::git::GitException &failure)
    {
        showFailure(fl::i18n::ustring_to_utf8(failure.GetUnicodeMessageTxt()));
        if (branches.getRepositoryState() == "Conflicts")
            offerToResolve();
    }
}

bool hasFilesInHead(const vclink::git::BranchManager &branches)
{
    const std::string emptyTree = "4b825dc642cb6eb9a060e54bf8d69288fbee4904";
    try
    {
        return branches.getRevision("HEAD^{tree}") != emptyTree;
    }
    catch (const vclink::git::LibGit2Exception &)
    {
        return false; // there is no commit yet
    }
}

/// The states of all files; nothing if they cannot be known.
std::optional<vclink::FileStateMap> readStates(vclink::CMAdapter &adapter)
{
    vclink::FileStateMap states = adapter.getFolderStates(adapter.getRootFolder());
    if (states.empty() && hasFilesInHead(*vclink::git::BranchManager::create(adapter)))
        return std::nullopt;
    return states;
}

void showLog()
{
    namespace log = boost::log;
    log::core::get()->set_exception_handler(log::make_exception_suppressor());
    using Sink = log::sinks::synchronous_sink<log::sinks::text_ostream_backend>;
    const auto sink = boost::make_shared<Sink>();
    sink->locked_backend()->add_stream(
        boost::shared_ptr<std::ostream>(&std::clog, boost::null_deleter()));
    sink->set_filter(log::expressions::attr<std::string>("Channel") == "vclink::git");
    sink->set_formatter(log::expressions::stream << log::expressions::attr<unsigned>("Severity")
                                                 << ' ' << log::expressions::smessage);
    log::core::get()->add_sink(sink);
    vclink_host::setEnabledSeverities("vclink::git", 0x08 | 0x10);
}

void speakGerman()
{
    vclink_host::setGlobalLocale(fl::i18n::VkLocale("de"));
}

} // namespace integrating
