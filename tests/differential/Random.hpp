// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <random>
#include <vector>

namespace vclink::test
{

/// Numbers that depend on the seed alone: the standard's distributions differ between libraries,
/// so none is used.
class Random
{
  public:
    explicit Random(std::uint64_t seed) : engine_(seed)
    {
    }

    /// 0 to `end` - 1
    std::size_t below(std::size_t end)
    {
        return static_cast<std::size_t>(engine_() % end);
    }
    bool chance(unsigned percent)
    {
        return below(100) < percent;
    }
    template <class Value> const Value &pick(const std::vector<Value> &values)
    {
        return values[below(values.size())];
    }

  private:
    std::mt19937_64 engine_;
};

} // namespace vclink::test
