// SPDX-License-Identifier: MIT
#include "relay.hpp"

#include <array>
#include <cerrno>
#include <stdexcept>
#include <thread>
#include <utility>

#include <poll.h>

namespace vclink::test
{
namespace
{

/// Both ends of what is passed on.
class Relay
{
  public:
    Relay(Connection &client, std::uint16_t port, const RelayPlan &plan)
        : client_(client), server_(Connection::open(port, client.stop())), plan_(plan)
    {
    }

    void run()
    {
        Fate fate = Fate::GoesOn;
        while (fate == Fate::GoesOn)
            fate = passOn();
        if (fate == Fate::Resets)
            client_.reset();
        else
            client_.close();
    }

  private:
    Fate passOn()
    {
        std::array<pollfd, 3> waited{{{client_.descriptor(), POLLIN, 0},
                                      {server_.descriptor(), POLLIN, 0},
                                      {client_.stop(), POLLIN, 0}}};
        if (::poll(waited.data(), waited.size(), -1) < 0 && errno != EINTR)
            throw std::runtime_error("poll");
        if (waited[2].revents != 0)
            return Fate::Closes;
        if (waited[1].revents != 0 && !move(server_, client_, toClient_))
            return Fate::Closes;
        if (waited[1].revents != 0)
            std::this_thread::sleep_for(plan_.pause);
        if (waited[0].revents != 0 && !move(client_, server_, toServer_))
            return Fate::Closes;
        return plan_.decide ? plan_.decide(toClient_, toServer_) : Fate::GoesOn;
    }

    /// Moves a block.
    /// @return whether there was one
    bool move(Connection &from, Connection &to, std::size_t &sum) const
    {
        const std::string bytes = from.read(plan_.blockSize);
        to.write(bytes);
        sum += bytes.size();
        return !bytes.empty();
    }

    Connection &client_;
    Connection server_;
    const RelayPlan &plan_;
    std::size_t toClient_ = 0;
    std::size_t toServer_ = 0;
};

} // namespace

void PrintTo(Fate fate, std::ostream *stream)
{
    static const std::array<const char *, 3> names{"GoesOn", "Closes", "Resets"};
    *stream << names.at(static_cast<std::size_t>(fate));
}

std::function<void(Connection &)> relayTo(std::uint16_t port, RelayPlan plan)
{
    return [port, plan = std::move(plan)](Connection &client) { Relay(client, port, plan).run(); };
}

} // namespace vclink::test
