// SPDX-License-Identifier: MIT
#include <iostream>

#include "fl/i18n/convert.hpp"
#include "vclink/ApplicationInteractor.hpp"
#include "vclink/ProgressReporter.hpp"
#include "vclink/Terminator.hpp"

class Progress : public vclink::ProgressReporter
{
  public:
    void setProgress(double fraction) override
    {
        std::cout << static_cast<int>(fraction * 100) << " %\n";
    }
    void setProgressMessage(const ustring &message) override
    {
        std::cout << fl::i18n::ustring_to_utf8(message) << '\n';
    }
};

class PlainInteractor : public vclink::ApplicationInteractor
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
