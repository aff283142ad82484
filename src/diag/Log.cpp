#include "Log.h"

namespace kx
{

const unsigned int* const kLogMaskWord = reinterpret_cast<const unsigned int*>(
    reinterpret_cast<const char*>(&g_LumLogParams) + kLogMaskOffset);

} // namespace kx
