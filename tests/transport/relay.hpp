// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <ostream>

#include "ScriptedServer.hpp"

namespace vclink::test
{

/// What becomes of a connection.
enum class Fate
{
    GoesOn,
    Closes,
    Resets
};

void PrintTo(Fate fate, std::ostream *stream);

/// How a connection is passed on.
struct RelayPlan
{
    /// No more than this goes through at once.
    std::size_t blockSize = 65536;
    /// Waited after each block towards the client.
    std::chrono::milliseconds pause{0};
    /// Asked after each block, with what went through so far, to the client and to the server.
    std::function<Fate(std::size_t toClient, std::size_t toServer)> decide;
};

/// A script that passes everything on between its client and a server on a port of 127.0.0.1.
std::function<void(Connection &)> relayTo(std::uint16_t port, RelayPlan plan);

} // namespace vclink::test
