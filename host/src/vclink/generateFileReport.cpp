// SPDX-License-Identifier: MIT
#include "vclink/util/generateFileReport.hpp"

namespace vclink::util
{

// By value because of the host's interface, though only read here.
ustring generateFileReport(std::vector<upath> files)
{
    ustring report;
    const char16_t *before = u"";
    for (const upath &file : files)
    {
        report += before;
        report += file.string();
        before = u"\n";
    }
    return report;
}

} // namespace vclink::util
