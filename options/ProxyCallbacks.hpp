// SPDX-License-Identifier: MIT
#pragma once

namespace vclink::git
{

/// A set without callbacks: no proxy is ever asked about.
class ProxyCallbacks
{
};

} // namespace vclink::git
