// MpiWorld: the processes of an MPI job, and messages between them.
#include "MpiWorld.h"

#include <mpi.h>

#include <array>

namespace morvik::simulation {

// Return codes of MPI are not checked: by default any failure ends the job.

MpiWorld::MpiWorld()
{
    int provided = 0;
    MPI_Init_thread(nullptr, nullptr, MPI_THREAD_FUNNELED, &provided);
    MPI_Comm_rank(MPI_COMM_WORLD, &itsRank);
    MPI_Comm_size(MPI_COMM_WORLD, &itsRanks);
}

MpiWorld::~MpiWorld()
{
    if (!itsIsAbandoned) {
        MPI_Finalize();
    }
}

int MpiWorld::rank() const
{
    return itsRank;
}

int MpiWorld::ranks() const
{
    return itsRanks;
}

std::string MpiWorld::host()
{
    std::array<char, MPI_MAX_PROCESSOR_NAME> name = {};
    int length = 0;
    MPI_Get_processor_name(name.data(), &length);
    return {name.data(), static_cast<std::size_t>(length)};
}

void MpiWorld::send(int rank, MpiMessageKind kind, const std::string& content)
{
    MPI_Send(content.data(), static_cast<int>(content.size()), MPI_BYTE, rank, static_cast<int>(kind), MPI_COMM_WORLD);
}

void MpiWorld::sendToOthers(MpiMessageKind kind, const std::string& content) const
{
    for (int rank = 0; rank < itsRanks; ++rank) {
        if (rank != itsRank) {
            send(rank, kind, content);
        }
    }
}

std::optional<MpiMessage> MpiWorld::receive()
{
    int hasCome = 0;
    MPI_Status status = {};
    MPI_Iprobe(MPI_ANY_SOURCE, MPI_ANY_TAG, MPI_COMM_WORLD, &hasCome, &status);
    if (hasCome == 0) {
        return std::nullopt;
    }
    int size = 0;
    MPI_Get_count(&status, MPI_BYTE, &size);
    MpiMessage message{status.MPI_SOURCE,
                       static_cast<MpiMessageKind>(status.MPI_TAG),
                       std::string(static_cast<std::size_t>(size), '\0')};
    MPI_Recv(message.content.data(), size, MPI_BYTE, message.rank, status.MPI_TAG, MPI_COMM_WORLD, MPI_STATUS_IGNORE);
    return message;
}

void MpiWorld::abandon()
{
    itsIsAbandoned = true;
}

}  // namespace morvik::simulation
