# ARMv7-A, floating-point arguments in floating-point registers.
set(triplet arm-linux-gnueabihf)
set(architecture armhf)
set(CMAKE_CXX_FLAGS_INIT "-march=armv7-a+fp")
include(${CMAKE_CURRENT_LIST_DIR}/armv7-linux-common.cmake)
