#ifndef KX_BENCH_WITHOUT_GATES_LOG_H
#define KX_BENCH_WITHOUT_GATES_LOG_H

// Replaces src/diag/Log.h in the build that measures what the gates cost: every gate is
// checked by the compiler and left out.

#include "../../../src/diag/Log.h"

#undef KX_LOG
#define KX_LOG(level, tag, text)                                                                   \
    do                                                                                             \
    {                                                                                              \
        if (false)                                                                                 \
        {                                                                                          \
            KxLog(__LINE__, level, tag, text);                                                     \
        }                                                                                          \
    } while (false)

#undef KX_LOG_OF
#define KX_LOG_OF(level, tag, format, argument)                                                    \
    do                                                                                             \
    {                                                                                              \
        if (false)                                                                                 \
        {                                                                                          \
            KxLog(__LINE__, level, tag, format, argument);                                         \
        }                                                                                          \
    } while (false)

#undef KX_TRACE
#define KX_TRACE(function, tag) static_cast<void>(tag)

#undef KX_LOG_EITHER
#define KX_LOG_EITHER(one, other) if (false)

#endif
