// SPDX-License-Identifier: MIT
#include "foundation/core/diag/stacktrace_base.hpp"

#include <algorithm>
#include <string>

#include <boost/stacktrace/frame.hpp>
#include <boost/stacktrace/safe_dump_to.hpp>

#include "fl/i18n/convert.hpp"

namespace foundation::core::diag
{

void stacktrace_base::capture(unsigned long skip) noexcept
{
    using Address = boost::stacktrace::frame::native_frame_ptr_t;
    std::array<Address, capacity + 1> buffer; // one more for the zero that ends a dump
    const std::size_t dumped =
        boost::stacktrace::safe_dump_to(skip + 1, buffer.data(), sizeof(buffer));
    size_ = std::min(dumped > 0 ? dumped - 1 : 0, capacity);
    const auto unused = std::copy_n(buffer.begin(), size_, frames_.begin());
    std::fill(unused, frames_.end(), nullptr);
}

std::size_t stacktrace_base::size() const noexcept
{
    return size_;
}

const void *stacktrace_base::frame(std::size_t index) const noexcept
{
    return frames_[index];
}

ustring stacktrace_base::to_text() const
{
    std::string text;
    for (std::size_t index = 0; index < size_; ++index)
    {
        text += index == 0 ? "" : "\n";
        text += std::to_string(index) + "# ";
        text += boost::stacktrace::to_string(boost::stacktrace::frame(frames_[index]));
    }
    return fl::i18n::utf8_to_ustring(text);
}

} // namespace foundation::core::diag
