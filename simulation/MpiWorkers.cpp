// MpiWorkers: spreads the batches of rank 0 over the processes of an MPI job.
#include "MpiWorkers.h"

#include <algorithm>
#include <exception>
#include <memory>
#include <thread>
#include <utility>

#include "Packing.h"
#include "base/Error.h"

namespace morvik::simulation {

namespace {

/// How long a rank waits for its threads before it polls for messages: short compared with a batch. MPI's own ways to
/// wait would keep a core busy.
constexpr std::chrono::milliseconds pause(1);

/// What all ranks must agree on.
std::string agreement(const Plan& plan)
{
    return "version " + plan.version + ", " + plan.command;
}

/// A rank that works for rank 0.
class Helper {
public:
    Helper(const Plan* plan, unsigned threads, std::string instructionSet)
        : itsPlan(plan), itsThreadCount(threads), itsInstructionSet(std::move(instructionSet))
    {
    }

    /// Works until rank 0 ends it.
    void work()
    {
        for (;;) {
            while (const auto message = MpiWorld::receive()) {
                if (message->kind == MpiMessageKind::end) {
                    MpiWorld::send(0, MpiMessageKind::ended);
                    return;
                }
                protect([&] { obey(*message); });
            }
            protect([this] { giveResult(); });
        }
    }

private:
    /// Reports exceptions to rank 0. They end the work, but messages are still answered.
    template <class Action>
    void protect(Action action)
    {
        try {
            action();
        } catch (const std::exception& error) {
            itsThreads.reset();
            MpiWorld::send(0, MpiMessageKind::failure, MpiWorld::host() + ": " + error.what());
        }
    }

    void obey(const MpiMessage& message)
    {
        if (message.kind == MpiMessageKind::begin) {
            begin(message.content);
        } else if (message.kind == MpiMessageKind::batch && itsThreads) {
            itsThreads->handOut(unpackedBatch(message.content));
        } else if (message.kind == MpiMessageKind::forget) {
            if (itsThreads) {
                itsThreads->forgetAll();
            }
            MpiWorld::send(0, MpiMessageKind::forgotten);
        }
    }

    void begin(const std::string& agreed)
    {
        if (itsPlan == nullptr || agreement(*itsPlan) != agreed) {
            throw base::Error("is of another version than rank 0, or has other arguments");
        }
        itsThreads = std::make_unique<ThreadWorkers>(*itsPlan, itsThreadCount, itsInstructionSet);
    }

    void giveResult()
    {
        if (!itsThreads) {
            std::this_thread::sleep_for(pause);
            return;
        }
        if (const auto result = itsThreads->take(pause)) {
            MpiWorld::send(0, MpiMessageKind::result, packed(*result));
        }
    }

    const Plan* itsPlan;
    unsigned itsThreadCount;
    std::string itsInstructionSet;
    std::unique_ptr<ThreadWorkers> itsThreads;  // from the begin message until a failure
};

}  // namespace

MpiWorkers::MpiWorkers(const MpiWorld& world, const Plan& plan, unsigned threads, const std::string& instructionSet)
    : itsWorld(world), itsThreads(plan, threads, instructionSet), itsRanks(static_cast<std::size_t>(world.ranks()))
{
    itsWorld.sendToOthers(MpiMessageKind::begin, agreement(plan));
}

unsigned MpiWorkers::count() const
{
    return itsThreads.count() * static_cast<unsigned>(itsRanks.size());
}

void MpiWorkers::handOut(const FrameBatch& batch)
{
    const auto hasLess = [](const Rank& a, const Rank& b) {
        return a.batchesOut < b.batchesOut;
    };
    const auto idlest = std::min_element(itsRanks.begin(), itsRanks.end(), hasLess);
    idlest->batchesOut += 1;
    if (idlest == itsRanks.begin()) {
        itsThreads.handOut(batch);
    } else {
        MpiWorld::send(static_cast<int>(idlest - itsRanks.begin()), MpiMessageKind::batch, packed(batch));
    }
}

std::optional<BatchResult> MpiWorkers::take(std::chrono::milliseconds patience)
{
    const auto end = std::chrono::steady_clock::now() + patience;
    std::chrono::milliseconds wait(0);
    do {
        if (auto result = itsThreads.take(wait)) {
            itsRanks.front().batchesOut -= 1;
            return result;
        }
        if (auto result = takeFromOthers()) {
            return result;
        }
        wait = pause;
    } while (std::chrono::steady_clock::now() < end);
    return std::nullopt;
}

std::optional<BatchResult> MpiWorkers::takeFromOthers()
{
    while (const auto message = MpiWorld::receive()) {
        Rank& rank = itsRanks[static_cast<std::size_t>(message->rank)];
        if (message->kind == MpiMessageKind::failure) {
            throw base::Error("rank " + std::to_string(message->rank) + " on " + message->content);
        }
        if (message->kind == MpiMessageKind::forgotten) {
            rank.forgetsOut -= 1;
        } else if (message->kind == MpiMessageKind::result && rank.forgetsOut == 0) {
            rank.batchesOut -= 1;
            return unpackedResult(message->content);
        }
    }
    return std::nullopt;
}

void MpiWorkers::forgetAll()
{
    itsThreads.forgetAll();
    itsWorld.sendToOthers(MpiMessageKind::forget);
    for (std::size_t i = 0; i < itsRanks.size(); ++i) {
        itsRanks[i].batchesOut = 0;
        itsRanks[i].forgetsOut += i > 0 ? 1 : 0;
    }
}

void workForRankZero(const Plan* plan, unsigned threads, const std::string& instructionSet)
{
    Helper(plan, threads, instructionSet).work();
}

bool dismissOthers(const MpiWorld& world, std::chrono::milliseconds patience)
{
    world.sendToOthers(MpiMessageKind::end);
    const auto end = std::chrono::steady_clock::now() + patience;
    int others = world.ranks() - 1;
    // Results may still be in flight, and a sender may block until its message is received.
    while (others > 0 && std::chrono::steady_clock::now() < end) {
        const auto message = MpiWorld::receive();
        if (!message) {
            std::this_thread::sleep_for(pause);
        } else if (message->kind == MpiMessageKind::ended) {
            others -= 1;
        }
    }
    return others == 0;
}

}  // namespace morvik::simulation
