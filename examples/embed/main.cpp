// SPDX-License-Identifier: MIT
// The smallest host: prints the branch of a working copy, and what in it is not clean. Built by the
// CMakeLists.txt beside it, or by
//
//     c++ -std=c++17 main.cpp $(pkg-config --cflags --libs vclink_git) -o embed
#include <exception>
#include <iostream>
#include <memory>

#include "fl/i18n/convert.hpp"
#include "foundation/core/except/IUserException.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/git/BranchManager.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace
{

/// Shows what a long operation is doing. Called on the thread of the operation.
class Progress : public vclink::ProgressReporter
{
  public:
    void setProgress(double fraction) override
    {
        std::cerr << static_cast<int>(fraction * 100) << " %\n";
    }
    void setProgressMessage(const ustring &message) override
    {
        std::cerr << fl::i18n::ustring_to_utf8(message) << '\n';
    }
};

/// What the library needs from its host: a display for progress, and a way to cancel.
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

const char *nameOf(vclink::FileState state)
{
    static const char *const names[] = {"unversioned", "clean", "unknown", "conflict",
                                        "modified",    "added", "deleted", "missing"};
    return names[state.getState()];
}

int show(const upath &folder)
{
    const vclink::git::GitAdapterFactory factory;
    if (!factory.isAdapterFor(folder))
    {
        std::cerr << "no working copy of Git\n";
        return 1;
    }
    // The adapter shares the interactor, and outlives what is made from it.
    const auto adapter = factory.createAdapterFor(folder, std::make_shared<Interactor>());
    const auto branches = vclink::git::BranchManager::create(*adapter);
    std::cout << "on " << branches->getCurrentBranch().getName() << '\n';
    for (const auto &[path, state] : adapter->getFolderStates(folder))
    {
        if (state != vclink::FileState(vclink::FileState::Clean))
            std::cout << nameOf(state) << ' ' << fl::i18n::ustring_to_utf8(path.string()) << '\n';
    }
    return 0;
}

} // namespace

int main(int count, char **arguments)
{
    try
    {
        if (count == 2)
            return show(fl::i18n::utf8_to_ustring(arguments[1]));
        std::cerr << "Usage: embed FOLDER\n";
        return 2;
    }
    catch (const foundation::core::except::IUserException &exception)
    {
        // The library's own failures, in the language of the user.
        std::cerr << fl::i18n::ustring_to_utf8(exception.GetUnicodeMessageTxt()) << '\n';
    }
    catch (const std::exception &exception)
    {
        std::cerr << exception.what() << '\n';
    }
    return 1;
}
