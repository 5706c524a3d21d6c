// Status: the return codes of the C interface, and the error line of a refused call.
#include "Status.h"

#include "Messages.h"

namespace morvik::simulation_call {

Status refuse(const char* reason)
{
    messages::writeError("ERROR:decoder:", reason);
    return refused;
}

}  // namespace morvik::simulation_call
