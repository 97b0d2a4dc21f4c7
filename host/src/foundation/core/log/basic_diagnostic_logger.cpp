// SPDX-License-Identifier: MIT
#include "foundation/core/log/basic_diagnostic_logger.hpp"

#include <utility>

#include <boost/log/attributes/attribute_set.hpp>
#include <boost/log/attributes/attribute_value_impl.hpp>
#include <boost/log/attributes/constant.hpp>
#include <boost/log/core.hpp>
#include <boost/log/expressions/message.hpp>
#include <boost/thread/tss.hpp>

#include "foundation/core/log/logger_registry.hpp"

namespace foundation::core::log
{

template <class Char> struct diagnostic_record<Char>::Impl
{
    boost::log::record record;
};

template <class Char> diagnostic_record<Char>::diagnostic_record() noexcept = default;

template <class Char>
diagnostic_record<Char>::diagnostic_record(diagnostic_record &&other) noexcept = default;

template <class Char>
diagnostic_record<Char> &
diagnostic_record<Char>::operator=(diagnostic_record &&other) noexcept = default;

template <class Char> diagnostic_record<Char>::~diagnostic_record() = default;

template <class Char>
diagnostic_record<Char>::diagnostic_record(std::unique_ptr<Impl> impl) noexcept
    : impl_(std::move(impl))
{
}

template <class Char> diagnostic_record<Char>::operator bool() const noexcept
{
    return impl_ != nullptr;
}

template <class Char>
typename diagnostic_record<Char>::Impl &diagnostic_record<Char>::impl() noexcept
{
    return *impl_;
}

template <class Char> struct basic_diagnostic_logger<Char>::Impl
{
    explicit Impl(const std::string &channel) : name(channel)
    {
        attributes["Channel"] = boost::log::attributes::constant<std::string>(channel);
    }

    std::string name;
    boost::log::attribute_set attributes;
    boost::thread_specific_ptr<int> depth;
};

template <class Char>
basic_diagnostic_logger<Char>::basic_diagnostic_logger(const std::string &name)
    : impl_(std::make_unique<Impl>(name))
{
    LoggerRegistry::instance().attach(name, enabled_severities_);
}

template <class Char> basic_diagnostic_logger<Char>::~basic_diagnostic_logger()
{
    LoggerRegistry::instance().detach(enabled_severities_);
}

template <class Char> const std::string &basic_diagnostic_logger<Char>::name() const noexcept
{
    return impl_->name;
}

template <class Char> unsigned basic_diagnostic_logger<Char>::enabled_severities() const noexcept
{
    return enabled_severities_.load(std::memory_order_relaxed);
}

template <class Char>
void basic_diagnostic_logger<Char>::set_enabled_severities(unsigned mask) noexcept
{
    enabled_severities_.store(mask, std::memory_order_relaxed);
}

template <class Char> bool basic_diagnostic_logger<Char>::is_logging_enabled() const
{
    return boost::log::core::get()->get_logging_enabled();
}

template <class Char>
diagnostic_record<Char> basic_diagnostic_logger<Char>::open_record(unsigned severity)
{
    // The record has its own severity. Boost's severity loggers keep it for the thread: a record
    // that is written while this one's text is made would change it.
    boost::log::attribute_set attributes = impl_->attributes;
    attributes["Severity"] = boost::log::attributes::constant<unsigned>(severity);
    boost::log::record record = boost::log::core::get()->open_record(attributes);
    if (!record)
    {
        return {};
    }
    using RecordImpl = typename diagnostic_record<Char>::Impl;
    return diagnostic_record<Char>(std::make_unique<RecordImpl>(RecordImpl{std::move(record)}));
}

template <class Char>
void basic_diagnostic_logger<Char>::push_record(diagnostic_record<Char> record,
                                                const std::basic_string<Char> &text)
{
    boost::log::record &opened = record.impl().record;
    opened.attribute_values().insert(boost::log::expressions::tag::message::get_name(),
                                     boost::log::attributes::make_attribute_value(text));
    boost::log::core::get()->push_record(std::move(opened));
}

template <class Char> int &basic_diagnostic_logger<Char>::scope_depth()
{
    if (impl_->depth.get() == nullptr)
    {
        impl_->depth.reset(std::make_unique<int>(0).release());
    }
    return *impl_->depth;
}

template class diagnostic_record<char>;
template class basic_diagnostic_logger<char>;

} // namespace foundation::core::log
