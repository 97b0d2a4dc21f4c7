// SPDX-License-Identifier: MIT
#include "Peer.hpp"

#include <chrono>
#include <utility>

#include "differential/Snapshot.hpp"

namespace vclink::test
{
namespace
{

constexpr int mostTurns = 8;
constexpr std::chrono::seconds patience{30};

} // namespace

const std::vector<std::string> &Peer::trades()
{
    static const std::vector<std::string> trades{"add and commit", "switch", "status", "gc",
                                                 "pack-refs"};
    return trades;
}

Peer::Peer(const GitRepository &copy, std::string trade)
    : copy_(copy), trade_(std::move(trade)), thread_([this] { work(); })
{
}

Peer::~Peer()
{
    stop();
}

void Peer::stop()
{
    isOver_ = true;
    if (thread_.joinable())
        thread_.join();
}

void Peer::work()
{
    for (int turn = 0; turn < mostTurns && (turn == 0 || !isOver_); ++turn)
    {
        if (trade_ == "add and commit")
            addAndCommit(turn);
        else if (trade_ == "switch")
            run({"switch", "--quiet", turn % 2 == 0 ? "other" : "main"});
        else if (trade_ == "status")
            run({"status", "--porcelain"});
        else if (trade_ == "gc")
            run({"gc", "--quiet"});
        else
            run({"pack-refs", "--all", "--prune"});
    }
}

void Peer::addAndCommit(int turn)
{
    const std::string name = "of the peer " + std::to_string(turn);
    copy_.write(name, name);
    if (!run({"add", name}))
        return;
    acknowledged_.push_back(blobIdOf(name));
    run({"commit", "--quiet", "--message", name});
}

bool Peer::run(const std::vector<std::string> &arguments)
{
    const bool isDone = copy_.command(arguments).timeout(patience).run().succeeded();
    ++(isDone ? succeeded_ : failed_);
    return isDone;
}

} // namespace vclink::test
