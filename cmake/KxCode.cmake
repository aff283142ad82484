# How the project's own code is compiled.

include(CheckCXXCompilerFlag)

# In the spelling of GCC 4.4, the target's compiler.
function(kx_warnings target)
    target_compile_options(${target} PRIVATE -Wall -Wextra -pedantic -Wshadow -Wconversion)
    if(KX_WARNINGS_AS_ERRORS)
        target_compile_options(${target} PRIVATE -Werror)
    endif()
endfunction()

# Code that is built for the target too: C++98, nothing exported but what a header exports.
function(kx_library_code target)
    kx_warnings(${target})
    set_target_properties(${target} PROPERTIES
        CXX_STANDARD 98
        CXX_STANDARD_REQUIRED ON
        CXX_EXTENSIONS OFF
        CXX_VISIBILITY_PRESET hidden
        VISIBILITY_INLINES_HIDDEN ON)
endfunction()

# Code for the host alone: tools, tests.
function(kx_host_code target)
    kx_warnings(${target})
    set_target_properties(${target} PROPERTIES
        CXX_STANDARD 17
        CXX_STANDARD_REQUIRED ON
        CXX_EXTENSIONS OFF)
    # A 32-bit program otherwise fails with files whose size, time, inode number or place in a folder needs 64 bits.
    if(CMAKE_SIZEOF_VOID_P EQUAL 4)
        target_compile_definitions(${target} PRIVATE _FILE_OFFSET_BITS=64 _TIME_BITS=64)
    endif()
endfunction()

# Sources that are compiled together, a dozen at a time: what many of them include and instantiate costs most of the
# time. Names in their unnamed namespaces must differ.
option(KX_COMPILE_IN_BATCHES "Compile sources of the client and of the tests together" ON)
function(kx_in_batches target)
    set_target_properties(${target} PROPERTIES UNITY_BUILD ${KX_COMPILE_IN_BATCHES} UNITY_BUILD_BATCH_SIZE 12)
    if(KX_COMPILE_IN_BATCHES AND CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
        # GCC takes a source that is included for a header, whose unnamed namespace would be a mistake.
        target_compile_options(${target} PRIVATE -Wno-subobject-linkage)
    endif()
endfunction()

# Code that calls the engine. A newer engine may deprecate a call for which the oldest one that is supported has
# no replacement, which is worth knowing but no error. The engine's headers can pull in ICU's, whose C++ face
# needs C++11.
function(kx_uses_engine target)
    target_link_libraries(${target} PRIVATE LibXml2::LibXml2)
    target_compile_options(${target} PRIVATE -Wno-error=deprecated-declarations)
    target_compile_definitions(${target} PRIVATE U_SHOW_CPLUSPLUS_API=0)
endfunction()

# Exports from a shared library what the version script names, and nothing else: hidden visibility alone
# lets weak instances of standard templates out.
function(kx_exports target script)
    target_link_options(${target} PRIVATE LINKER:--version-script=${script})
    if(NOT KX_BUILD_FUZZ) # the fuzzer's and Clang's sanitizers' functions come with the program
        target_link_options(${target} PRIVATE LINKER:--no-undefined)
    endif()
    set_property(TARGET ${target} APPEND PROPERTY LINK_DEPENDS ${script})
endfunction()

# Calls of a shared library's own functions: no table, and no call where the compiler would rather have the
# function's code in place. What the library does not define itself stays replaceable.
check_cxx_compiler_flag(-fno-semantic-interposition KX_HAS_NO_SEMANTIC_INTERPOSITION)
function(kx_binds_own_calls target)
    if(KX_HAS_NO_SEMANTIC_INTERPOSITION)
        target_compile_options(${target} PRIVATE -fno-semantic-interposition)
    endif()
    target_link_options(${target} PRIVATE LINKER:-Bsymbolic-functions)
endfunction()
