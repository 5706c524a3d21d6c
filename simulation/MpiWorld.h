// MpiWorld: the processes of an MPI job, and messages between them.
#ifndef MORVIK_SIMULATION_MPIWORLD_H
#define MORVIK_SIMULATION_MPIWORLD_H

#include <optional>
#include <string>

namespace morvik::simulation {

/// What is said between rank 0 and another.
enum class MpiMessageKind : int {
    // from rank 0
    begin,   // batches of a plan will follow
    batch,   // simulate it
    forget,  // forget all batches so far
    end,     // leave
    // to rank 0
    result,     // of a batch
    forgotten,  // an answer: no results of earlier batches follow
    failure,    // why this rank gives no more results
    ended       // an answer: nothing follows
};

struct MpiMessage {
    int rank = 0;  // who sends it
    MpiMessageKind kind = MpiMessageKind::end;
    std::string content;
};

/// This process in its job. One object in one thread; messages between two ranks come in the order in which they
/// were sent.
class MpiWorld {
public:
    /// Joins the job.
    MpiWorld();
    MpiWorld(const MpiWorld&) = delete;
    MpiWorld& operator=(const MpiWorld&) = delete;
    /// Waits for the other processes and leaves.
    ~MpiWorld();

    int rank() const;
    int ranks() const;

    /// The name of this machine.
    static std::string host();

    static void send(int rank, MpiMessageKind kind, const std::string& content = {});

    /// Sends the same to all ranks but this one.
    void sendToOthers(MpiMessageKind kind, const std::string& content = {}) const;

    /// The next message that has come, if one has. Does not wait.
    static std::optional<MpiMessage> receive();

    /// This process will leave without waiting for the others, some of which may be dead.
    void abandon();

private:
    int itsRank = 0;
    int itsRanks = 0;
    bool itsIsAbandoned = false;
};

}  // namespace morvik::simulation

#endif
