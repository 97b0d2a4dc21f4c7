// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <utility>

#include <boost/log/attributes/value_extraction.hpp>
#include <boost/log/core/core.hpp>

namespace vclink::test
{

/// Asks a function about every record that is to be opened, for the life of the object. What the
/// function throws reaches the code that writes.
class CoreFilter
{
  public:
    /// @param accepts is given the record's severity
    explicit CoreFilter(std::function<bool(unsigned)> accepts)
    {
        boost::log::core::get()->set_filter(
            [accepts = std::move(accepts)](const boost::log::attribute_value_set &values)
            { return accepts(boost::log::extract_or_default<unsigned>("Severity", values, 0U)); });
    }
    CoreFilter(const CoreFilter &) = delete;
    CoreFilter &operator=(const CoreFilter &) = delete;
    ~CoreFilter()
    {
        boost::log::core::get()->reset_filter();
    }
};

} // namespace vclink::test
