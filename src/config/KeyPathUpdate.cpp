#include "KeyPathUpdate.h"

#include "UpdateWalk.h"

namespace kx
{

template int UpdateValues<Silent>(xmlNode* top, TextView key, const char* value,
                                  unsigned int& updated);

} // namespace kx
