// MpiWorld: the processes of an MPI job, and messages between them.
#ifndef MORVIK_SIMULATION_MPIWORLD_H
#define MORVIK_SIMULATION_MPIWORLD_H

#include <optional>
#include <string>

namespace morvik::simulation {

/// Messages between rank 0 and another rank.
enum class MpiMessageKind : int {
    // from rank 0
    begin,   // batches of a plan will follow
    batch,   // simulate it
    forget,  // forget all batches so far
    end,     // leave
    // to rank 0
    result,     // of a batch
    forgotten,  // answers forget: no results of earlier batches follow
    failure,    // why this rank returns no more results
    ended       // answers end: nothing follows
};

struct MpiMessage {
    int rank = 0;  // the sender
    MpiMessageKind kind = MpiMessageKind::end;
    std::string content;
};

/// This process in its MPI job. Use one object, in one thread. Messages between two ranks arrive in the order in which
/// they were sent.
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

    /// The next message that has arrived, if any. Does not block.
    static std::optional<MpiMessage> receive();

    /// Makes the destructor leave without waiting for the others, some of which may be dead.
    void abandon();

private:
    int itsRank = 0;
    int itsRanks = 0;
    bool itsIsAbandoned = false;
};

}  // namespace morvik::simulation

#endif
