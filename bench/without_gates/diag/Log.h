#ifndef KX_BENCH_WITHOUT_GATES_LOG_H
#define KX_BENCH_WITHOUT_GATES_LOG_H

// Stands in front of src/diag/Log.h in the build that tells what the gates cost: every gate is
// checked by the compiler and left out.

#include "../../../src/diag/Log.h"

#undef KX_LOG_RECORD
#define KX_LOG_RECORD(level, tag, text)                                                            \
    do                                                                                             \
    {                                                                                              \
        if (false)                                                                                 \
        {                                                                                          \
            KxLog(__LINE__, level, tag, text);                                                     \
        }                                                                                          \
    } while (false)

#undef KX_LOG_RECORD_OF
#define KX_LOG_RECORD_OF(level, tag, format, argument)                                             \
    do                                                                                             \
    {                                                                                              \
        if (false)                                                                                 \
        {                                                                                          \
            KxLog(__LINE__, level, tag, format, argument);                                         \
        }                                                                                          \
    } while (false)

#undef KX_TRACE_BOTH
#define KX_TRACE_BOTH() static_cast<void>(0)

#undef KX_LOG_EITHER
#define KX_LOG_EITHER(one, other) if (false)

#endif
