// SPDX-License-Identifier: MIT
#include "bench/host.hpp"

#include <fstream>

#include "fl/i18n/convert.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/Terminator.hpp"
#include "vclink/git/GitAdapterFactory.hpp"

namespace vclink::bench
{
namespace
{

class NoProgress : public ProgressReporter
{
  public:
    void setProgress(double /*fraction*/) override
    {
    }
    void setProgressMessage(const ustring & /*message*/) override
    {
    }
};

class Interactor : public ApplicationInteractor
{
  public:
    Terminator &getTerminator() override
    {
        return terminator_;
    }
    ProgressReporter *getProgressReporter() override
    {
        return &progress_;
    }

  private:
    Terminator terminator_;
    NoProgress progress_;
};

} // namespace

upath toPath(const std::string &text)
{
    return upath(fl::i18n::utf8_to_ustring(text));
}

std::vector<upath> readPaths(const std::string &root, const char *listFile)
{
    std::ifstream list(listFile);
    std::vector<upath> paths;
    for (std::string name; std::getline(list, name);)
    {
        paths.push_back(toPath(root + "/" + name));
    }
    return paths;
}

std::unique_ptr<CMAdapter> makeAdapter(const upath &root)
{
    return git::GitAdapterFactory().createAdapterFor(root, std::make_shared<Interactor>());
}

std::unique_ptr<WorkingCopyGenerator> makeGenerator()
{
    return git::GitAdapterFactory().createWorkingCopyGenerator(std::make_shared<Interactor>());
}

} // namespace vclink::bench
