// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <memory>
#include <string>

#include "vclink_host/export.hpp"

namespace foundation::core::log
{

/// An open record, which needs a text and must be pushed; or none, if no sink wants it. Move only.
template <class Char> class VCLINK_HOST_EXPORT diagnostic_record
{
  public:
    diagnostic_record() noexcept;
    diagnostic_record(diagnostic_record &&other) noexcept;
    diagnostic_record &operator=(diagnostic_record &&other) noexcept;
    ~diagnostic_record();

    explicit operator bool() const noexcept;

    /// Opaque: only the logger's source file defines it.
    struct Impl;
    explicit diagnostic_record(std::unique_ptr<Impl> impl) noexcept;
    Impl &impl() noexcept;

  private:
    std::unique_ptr<Impl> impl_;
};

/// A named source of diagnostic records, based on Boost.Log. Its records have the attributes
/// "Severity" (unsigned int, a single bit), "Channel" (std::string, the logger's name) and
/// "Message" (std::string, UTF-8). It sets no output: the sinks of Boost.Log's core decide where
/// records go.
///
/// Has a mask of enabled severities: by default none, except those that the host has enabled for
/// this name before (vclink_host/logging.hpp). Can be used from several threads at once.
template <class Char> class VCLINK_HOST_EXPORT basic_diagnostic_logger
{
  public:
    /// @param name the channel, by which the host finds the logger
    explicit basic_diagnostic_logger(const std::string &name);
    basic_diagnostic_logger(const basic_diagnostic_logger &) = delete;
    basic_diagnostic_logger &operator=(const basic_diagnostic_logger &) = delete;
    ~basic_diagnostic_logger();

    const std::string &name() const noexcept;

    /// Returns true if any bit of `severity` is enabled: one load and one test.
    bool is_enabled(unsigned severity) const noexcept
    {
        return (enabled_severities_.load(std::memory_order_relaxed) & severity) != 0;
    }
    unsigned enabled_severities() const noexcept;
    void set_enabled_severities(unsigned mask) noexcept;

    /// Returns true if Boost.Log's core accepts records.
    bool is_logging_enabled() const;
    /// Opens a record with this severity. The record is false if no sink wants it.
    /// @throws what the sinks' filters throw
    diagnostic_record<Char> open_record(unsigned severity);
    /// Sets the text of the record and passes it to the sinks.
    /// @throws what the sinks throw
    void push_record(diagnostic_record<Char> record, const std::basic_string<Char> &text);

    /// Returns the calling thread's count of open scopes, which starts at 0 on every thread.
    int &scope_depth();

  private:
    struct Impl;
    std::atomic<unsigned> enabled_severities_{0};
    std::unique_ptr<Impl> impl_;
};

extern template class diagnostic_record<char>;
extern template class basic_diagnostic_logger<char>;

} // namespace foundation::core::log
