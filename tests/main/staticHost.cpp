// SPDX-License-Identifier: MIT
// A host that holds what the library made in objects of static storage, which end after main. All
// severities are enabled, and without a sink of its own Boost.Log prints each record.
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <memory>

#include "fl/i18n/convert.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/FileStateMap.hpp"
#include "vclink/WorkingCopyGenerator.hpp"
#include "vclink/git/GitAdapterFactory.hpp"
#include "vclink/git/GitConfig.hpp"
#include "vclink/git/LibGit2Guard.hpp"
#include "vclink_host/logging.hpp"

namespace
{

class Interactor : public vclink::ApplicationInteractor
{
  public:
    vclink::Terminator &getTerminator() override
    {
        return terminator_;
    }
    vclink::ProgressReporter *getProgressReporter() override
    {
        return nullptr;
    }

  private:
    vclink::Terminator terminator_;
};

void enableAllSeverities()
{
    vclink_host::setEnabledSeverities("vclink::git", ~0U);
}

bool enableAtTheStart()
{
    // Before any argument of main is known.
    if (std::getenv("VCLINK_TEST_LOG_EARLY") != nullptr)
    {
        enableAllSeverities();
    }
    return true;
}

const bool isEnabled = enableAtTheStart();
const vclink::git::LibGit2Guard guard;
const vclink::git::GitConfig config;
const std::shared_ptr<vclink::ApplicationInteractor> interactor = std::make_shared<Interactor>();
const std::unique_ptr<vclink::CMAdapter> adapter =
    vclink::git::GitAdapterFactory().createAdapterFor(upath(u"."), interactor);
const std::unique_ptr<vclink::WorkingCopyGenerator> generator =
    vclink::git::GitAdapterFactory().createWorkingCopyGenerator(interactor);

} // namespace

int main(int count, char **arguments)
{
    enableAllSeverities();
    if (count > 1 && std::strcmp(arguments[1], "use") == 0)
    {
        generator->generate(fl::i18n::utf8_to_ustring(arguments[2]), upath(u"clone"));
        std::cout << adapter->getFolderStates(upath(u".")).size() << " files\n";
    }
    return isEnabled ? 0 : 1;
}
