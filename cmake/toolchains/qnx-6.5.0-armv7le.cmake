# QNX Neutrino 6.5.0 on ARMv7-A, little endian, by the SDK's own compiler: GCC 4.4.2 behind qcc.
#
# The environment variables of the SDK's setup script locate it: QNX_HOST (the tools) and QNX_TARGET (headers
# and libraries). KX_QNX_CXX_RUNTIME selects the C++ run-time library: cpp (Dinkum, the SDK's default) or gpp (GNU).
# All code of a process must use the same one. See docs/development/building-for-qnx.md.
set(CMAKE_SYSTEM_NAME QNX)
set(CMAKE_SYSTEM_VERSION 6.5.0)
set(CMAKE_SYSTEM_PROCESSOR armv7le)

foreach(variable QNX_HOST QNX_TARGET)
    if(NOT IS_DIRECTORY "$ENV{${variable}}")
        message(FATAL_ERROR "${variable} names no folder: run the setup script of the QNX 6.5.0 SDK first")
    endif()
    file(TO_CMAKE_PATH "$ENV{${variable}}" ${variable})
endforeach()

set(KX_QNX_CXX_RUNTIME cpp CACHE STRING "C++ run-time library: cpp (Dinkum) or gpp (GNU)")
set_property(CACHE KX_QNX_CXX_RUNTIME PROPERTY STRINGS cpp gpp)
if(NOT KX_QNX_CXX_RUNTIME MATCHES "^(cpp|gpp)$")
    message(FATAL_ERROR "KX_QNX_CXX_RUNTIME is \"${KX_QNX_CXX_RUNTIME}\"; it is cpp (Dinkum) or gpp (GNU)")
endif()
# CMake tries the compiler in projects of its own.
list(APPEND CMAKE_TRY_COMPILE_PLATFORM_VARIABLES KX_QNX_CXX_RUNTIME)

# The driver's name in capitals is the one for C++. What it compiles with is selected by -V, the run-time library
# by -Y, when compiling and when linking.
set(CMAKE_C_COMPILER ${QNX_HOST}/usr/bin/qcc)
set(CMAKE_CXX_COMPILER ${QNX_HOST}/usr/bin/QCC)
set(CMAKE_C_COMPILER_TARGET 4.4.2,gcc_ntoarmv7le)
set(CMAKE_CXX_COMPILER_TARGET 4.4.2,gcc_ntoarmv7le)
set(CMAKE_CXX_FLAGS_INIT -Y_${KX_QNX_CXX_RUNTIME})

# The platform's own libxml2 and headers, and none of this machine's.
set(CMAKE_FIND_ROOT_PATH ${QNX_TARGET}/armle-v7 ${QNX_TARGET})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)
