// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <utility>

namespace scl::core::memory
{

/// An owning pointer with a type-erased deleter, so that its holder needs no definition of T.
template <class T> using unique_incomplete_ptr = std::unique_ptr<T, std::function<void(T *)>>;

/// Creates an Actual and returns it as a T. Only the caller needs the definition of Actual.
/// @throws std::bad_alloc, and what Actual's constructor throws; then nothing is left
template <class T, class Actual, class... Args>
unique_incomplete_ptr<T> make_unique_incomplete(Args &&...args)
{
    auto owned = std::make_unique<Actual>(std::forward<Args>(args)...);
    std::function<void(T *)> deleter = [](T *object) { delete static_cast<Actual *>(object); };
    return unique_incomplete_ptr<T>(owned.release(), std::move(deleter));
}

} // namespace scl::core::memory
