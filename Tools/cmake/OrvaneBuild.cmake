# What every target of the project is compiled and linked with.

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)

option(ORVANE_WARNINGS_ARE_ERRORS "Treat compiler warnings as errors" OFF)

find_program(CCACHE ccache)
if(CCACHE)
    # The compiler's precompiled headers are only cached when these checks are relaxed.
    set(CMAKE_CXX_COMPILER_LAUNCHER
        ${CMAKE_COMMAND} -E env
        CCACHE_SLOPPINESS=pch_defines,time_macros,include_file_mtime,include_file_ctime
        CCACHE_BASEDIR=${PROJECT_SOURCE_DIR} ${CCACHE})
endif()

add_library(orvane_options INTERFACE)
target_compile_options(orvane_options INTERFACE
    -Wall -Wextra -Wshadow -Wnon-virtual-dtor -Woverloaded-virtual -Wformat=2
    $<$<BOOL:${ORVANE_WARNINGS_ARE_ERRORS}>:-Werror>
    # False alarms of g++ 12 about its own std::string once it is inlined (GCC bug 105329).
    "$<$<AND:$<CXX_COMPILER_ID:GNU>,$<VERSION_LESS:$<CXX_COMPILER_VERSION>,13>>:-Wno-restrict;-Wno-stringop-overflow;-Wno-array-bounds>"
    # Lets the compiler cache keep what was compiled with a precompiled header.
    $<$<CXX_COMPILER_ID:GNU>:-fpch-preprocess>
    # Line tables are what a back trace needs; full debug information doubles the build.
    $<$<CONFIG:Debug>:-g1>)
target_link_options(orvane_options INTERFACE -Wl,--as-needed)

find_program(LLD ld.lld)
if(LLD)
    target_link_options(orvane_options INTERFACE -fuse-ld=lld)
endif()

if(ORVANE_SANITIZERS)
    set(sanitizers -fsanitize=address,undefined -fno-sanitize-recover=all -fno-omit-frame-pointer)
    target_compile_options(orvane_options INTERFACE ${sanitizers})
    target_link_options(orvane_options INTERFACE ${sanitizers})
endif()

if(ORVANE_FUZZERS)
    # Tells the fuzzer which branches of the library an input reached.
    target_compile_options(orvane_options INTERFACE -fsanitize=fuzzer-no-link)
endif()
