// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <memory>
#include <string>

#include "vclink_host/export.hpp"

namespace foundation::core::log
{

/// An opened record, to be given its text and pushed; or none, when no sink wants it. Move only.
template <class Char> class VCLINK_HOST_EXPORT diagnostic_record
{
  public:
    diagnostic_record() noexcept;
    diagnostic_record(diagnostic_record &&other) noexcept;
    diagnostic_record &operator=(diagnostic_record &&other) noexcept;
    ~diagnostic_record();

    explicit operator bool() const noexcept;

    /// Opaque; only the logger's source file knows it.
    struct Impl;
    explicit diagnostic_record(std::unique_ptr<Impl> impl) noexcept;
    Impl &impl() noexcept;

  private:
    std::unique_ptr<Impl> impl_;
};

/// A named source of diagnostic records on top of Boost.Log. Its records carry the attributes
/// "Severity" (unsigned int, a single bit), "Channel" (std::string, the logger's name) and
/// "Message" (std::string, UTF-8). It sets no output: where records go is decided by the sinks of
/// Boost.Log's core.
///
/// Holds a mask of enabled severities, none at the start save those that the host asked for under
/// this name before (vclink_host/logging.hpp). May be used from several threads at once.
template <class Char> class VCLINK_HOST_EXPORT basic_diagnostic_logger
{
  public:
    /// @param name the channel; the host reaches the logger by it
    explicit basic_diagnostic_logger(const std::string &name);
    basic_diagnostic_logger(const basic_diagnostic_logger &) = delete;
    basic_diagnostic_logger &operator=(const basic_diagnostic_logger &) = delete;
    ~basic_diagnostic_logger();

    const std::string &name() const noexcept;

    /// Whether any bit of `severity` is enabled: one load and one test.
    bool is_enabled(unsigned severity) const noexcept
    {
        return (enabled_severities_.load(std::memory_order_relaxed) & severity) != 0;
    }
    unsigned enabled_severities() const noexcept;
    void set_enabled_severities(unsigned mask) noexcept;

    /// Whether Boost.Log's core takes records at all.
    bool is_logging_enabled() const;
    /// Opens a record with this severity; false when no sink wants it.
    /// @throws what the sinks' filters raise
    diagnostic_record<Char> open_record(unsigned severity);
    /// Gives the record its text and hands it to the sinks.
    /// @throws what the sinks raise
    void push_record(diagnostic_record<Char> record, const std::basic_string<Char> &text);

    /// The calling thread's count of open scopes; starts at 0 on every thread.
    int &scope_depth();

  private:
    struct Impl;
    std::atomic<unsigned> enabled_severities_{0};
    std::unique_ptr<Impl> impl_;
};

extern template class diagnostic_record<char>;
extern template class basic_diagnostic_logger<char>;

} // namespace foundation::core::log
