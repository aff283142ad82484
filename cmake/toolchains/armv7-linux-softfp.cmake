# ARMv7-A by the calling convention of the target: floating-point arguments in general registers.
set(triplet arm-linux-gnueabi)
set(architecture armel)
set(CMAKE_CXX_FLAGS_INIT "-march=armv7-a+fp -mfloat-abi=softfp -mthumb")
include(${CMAKE_CURRENT_LIST_DIR}/armv7-linux-common.cmake)
