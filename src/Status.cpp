// Status: how a call of the C interface ends, and its line when it is refused.
#include "Status.h"

#include "Messages.h"

namespace morvik::simulation_call {

Status refuse(const char* reason)
{
    messages::writeError("ERROR:decoder:", reason);
    return refused;
}

}  // namespace morvik::simulation_call
