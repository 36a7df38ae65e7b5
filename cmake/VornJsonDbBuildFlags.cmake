# Compiler and linker flags of this project's own targets; none of them reaches a user of the
# library.

include(CheckCXXCompilerFlag)

get_property(VORNJSONDB_MULTI_CONFIG GLOBAL PROPERTY GENERATOR_IS_MULTI_CONFIG)
if(VORNJSONDB_TOP_LEVEL)
    if(NOT VORNJSONDB_MULTI_CONFIG AND NOT CMAKE_BUILD_TYPE)
        set(CMAKE_BUILD_TYPE Release CACHE STRING "Build type" FORCE)
    endif()
    # The library is small and waits for SQLite: -O3 only makes it larger.
    if(CMAKE_CXX_FLAGS_RELEASE STREQUAL "-O3 -DNDEBUG")
        set(CMAKE_CXX_FLAGS_RELEASE "-O2 -DNDEBUG")
    endif()
endif()


# ---- for every target of the project ---------------------------------------------------------
add_library(vornjsondb_build_flags INTERFACE)
target_compile_options(vornjsondb_build_flags INTERFACE
    -Wall -Wextra -Wpedantic -Wconversion -Wshadow -Wformat=2
    $<$<BOOL:${VORNJSONDB_WERROR}>:-Werror>)

# A call into another library then goes there by one instruction instead of by a stub. Elsewhere than on
# amd64 that takes more code at each call.
if(CMAKE_SYSTEM_PROCESSOR MATCHES "^(x86_64|amd64|AMD64)$" AND CMAKE_SIZEOF_VOID_P EQUAL 8)
    check_cxx_compiler_flag(-fno-plt VORNJSONDB_HAS_FNO_PLT)
    if(VORNJSONDB_HAS_FNO_PLT)
        target_compile_options(vornjsondb_build_flags INTERFACE -fno-plt)
    endif()
endif()

# Also handed to what the tests compile and link by themselves.
set(VORNJSONDB_INSTRUMENT_FLAGS "")
if(VORNJSONDB_SANITIZE)
    list(APPEND VORNJSONDB_INSTRUMENT_FLAGS
        -fsanitize=address,undefined -fno-sanitize-recover=all -fno-omit-frame-pointer
        -D_GLIBCXX_ASSERTIONS)
endif()
if(VORNJSONDB_COVERAGE)
    # Atomic counters: the tests run side by side and fork.
    list(APPEND VORNJSONDB_INSTRUMENT_FLAGS --coverage -fprofile-update=atomic)
endif()
target_compile_options(vornjsondb_build_flags INTERFACE ${VORNJSONDB_INSTRUMENT_FLAGS})
target_link_options(vornjsondb_build_flags INTERFACE ${VORNJSONDB_INSTRUMENT_FLAGS})

# ---- for the library alone -------------------------------------------------------------------
add_library(vornjsondb_hardening INTERFACE)
foreach(VORNJSONDB_FLAG -fstack-protector-strong -fstack-clash-protection)
    string(MAKE_C_IDENTIFIER "VORNJSONDB_HAS${VORNJSONDB_FLAG}" VORNJSONDB_HAS_FLAG)
    check_cxx_compiler_flag(${VORNJSONDB_FLAG} ${VORNJSONDB_HAS_FLAG})
    if(${VORNJSONDB_HAS_FLAG})
        target_compile_options(vornjsondb_hardening INTERFACE ${VORNJSONDB_FLAG})
    endif()
endforeach()
target_link_options(vornjsondb_hardening INTERFACE
    LINKER:-z,relro LINKER:-z,now LINKER:-z,noexecstack)
if(NOT VORNJSONDB_SANITIZE)
    # The checked C library calls hide memory errors from the sanitizer, whose run time the
    # program brings; without it the library must name everything that it needs.
    # -U first: some distributions' compilers define the macro by themselves.
    set(VORNJSONDB_OPTIMISED $<CONFIG:Release,RelWithDebInfo,MinSizeRel>)
    if(CMAKE_VERSION VERSION_LESS 3.19)
        set(VORNJSONDB_OPTIMISED
            $<OR:$<CONFIG:Release>,$<CONFIG:RelWithDebInfo>,$<CONFIG:MinSizeRel>>)
    endif()
    target_compile_options(vornjsondb_hardening INTERFACE
        "$<${VORNJSONDB_OPTIMISED}:-U_FORTIFY_SOURCE;-D_FORTIFY_SOURCE=2>")
    target_link_options(vornjsondb_hardening INTERFACE LINKER:-z,defs)
endif()

# ---- for the libraries, after the hardening ----------------------------------------------------
# A frame smaller than a page cannot step over the guard page of the stack. On 32-bit ARM the compiler
# probes the stack in every function all the same, which is a twentieth of the code; there the limit,
# which holds in every optimised build, stands for the probes.
add_library(vornjsondb_small_frames INTERFACE)
if(NOT VORNJSONDB_SANITIZE)
    target_compile_options(vornjsondb_small_frames INTERFACE
        "$<${VORNJSONDB_OPTIMISED}:-Wframe-larger-than=2048;-Wvla>")
    if(CMAKE_SYSTEM_PROCESSOR MATCHES "^arm" AND CMAKE_SIZEOF_VOID_P EQUAL 4)
        target_compile_options(vornjsondb_small_frames INTERFACE
            "$<${VORNJSONDB_OPTIMISED}:-fno-stack-clash-protection>")
    endif()
endif()

# Where size counts, gcc must not give functions of the standard library fewer arguments: it makes such
# a function anew for each source, and the linker keeps one only of those that are all the same. Nor
# need it keep what was computed once for another place: on 32-bit ARM, which has few registers, that
# takes more code than computing it again.
set(VORNJSONDB_LESS_CODE "$<$<CXX_COMPILER_ID:GNU>:-fno-ipa-sra;-fno-gcse>")
add_library(vornjsondb_less_code INTERFACE)
target_compile_options(vornjsondb_less_code INTERFACE
    "$<$<CONFIG:MinSizeRel>:${VORNJSONDB_LESS_CODE}>")
