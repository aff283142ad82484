# Debian's cross compilers, with the engine from the sysroot that scripts/arm_sysroot.sh makes, and qemu-arm to
# run what comes out. The file that includes this one has set triplet (Debian's name of the target) and
# architecture (of the packages in the sysroot).
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR armv7-a)
set(CMAKE_CXX_COMPILER ${triplet}-g++)
# The compiler remarks on a change of the calling convention in its version 7.
set(CMAKE_CXX_FLAGS_INIT "${CMAKE_CXX_FLAGS_INIT} -Wno-psabi")

set(sysroot ${CMAKE_CURRENT_LIST_DIR}/../../build/sysroot/${architecture})
get_filename_component(sysroot ${sysroot} ABSOLUTE)
set(CMAKE_FIND_ROOT_PATH ${sysroot} ${CMAKE_FIND_ROOT_PATH})
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)

# Where the engine finds the libraries that it needs itself: in the sysroot.
set(engine_needs ${sysroot}/usr/lib/${triplet}:${sysroot}/lib/${triplet})
set(CMAKE_EXE_LINKER_FLAGS_INIT -Wl,-rpath-link,${engine_needs})
set(CMAKE_SHARED_LINKER_FLAGS_INIT -Wl,-rpath-link,${engine_needs})
# The library is linked without its build directory, and finds the platform here.
set(libraries ${engine_needs}:${CMAKE_BINARY_DIR}/platform)
# The prefix of another engine than the sysroot's.
if(KX_ARM_ENGINE)
    set(LIBXML2_INCLUDE_DIR ${KX_ARM_ENGINE}/include/libxml2 CACHE PATH "")
    set(LIBXML2_LIBRARY ${KX_ARM_ENGINE}/lib/libxml2.so CACHE FILEPATH "")
    string(PREPEND libraries ${KX_ARM_ENGINE}/lib:)
endif()
set(CMAKE_CROSSCOMPILING_EMULATOR qemu-arm -L /usr/${triplet} -E LD_LIBRARY_PATH=${libraries})
