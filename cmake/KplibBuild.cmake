# Compiler settings that every target of this tree shares, and the tools around them.

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
# -O3 alone: results are to the bit, so nothing that lets the compiler reorder or contract floating-point work.
set(CMAKE_CXX_FLAGS_RELEASE "-O3 -DNDEBUG")

if(NOT CMAKE_SIZEOF_VOID_P EQUAL 8 OR NOT CMAKE_CXX_BYTE_ORDER STREQUAL "LITTLE_ENDIAN")
    message(FATAL_ERROR "kplib needs a little-endian 64-bit target: messages and voxel files hold its words as they are")
endif()

# The family of processors. Sources for one family end in its name: <Name>X86.cpp instead of <Name>Any.cpp, or beside
# <Name>.cpp with further rows for its kernels.
set(KPLIB_PROCESSOR Any)
if(CMAKE_SYSTEM_PROCESSOR MATCHES "^(x86_64|AMD64|amd64)$")
    set(KPLIB_PROCESSOR X86)
endif()

find_program(KPLIB_CCACHE ccache)
if(KPLIB_CCACHE)
    set(CMAKE_CXX_COMPILER_LAUNCHER ${KPLIB_CCACHE})
endif()

# The library's functions are not replaced from outside, so they may be inlined. In Release, paths in the objects start at
# the source folder: builds in two folders give the same bytes.
add_compile_options(-fno-math-errno -ffp-contract=off -fno-semantic-interposition -Wall -Wextra -Wpedantic -Wshadow
                    -Wnon-virtual-dtor -Woverloaded-virtual -Wcast-align -Wundef
                    "$<$<CONFIG:Release>:-ffile-prefix-map=${PROJECT_SOURCE_DIR}=.>")
if(KPLIB_WERROR)
    add_compile_options(-Werror)
endif()

# For the library and the examples; the tests compare numbers of all types.
set(KPLIB_CONVERSION_WARNINGS -Wconversion -Wsign-conversion -Wdouble-promotion)

# What users may turn on for their own code, and so for the public headers.
set(KPLIB_HEADER_WARNINGS ${KPLIB_CONVERSION_WARNINGS} -Wold-style-cast)

# What ships is hardened: overwritten stacks and buffers of known size end the process, and tables of addresses are
# read-only. The sanitizers have checks of their own.
if(NOT KPLIB_SANITIZE)
    add_compile_options($<$<CONFIG:Release>:-fstack-protector-strong>
                        "$<$<CONFIG:Release>:SHELL:-U_FORTIFY_SOURCE -D_FORTIFY_SOURCE=2>")
    add_link_options($<$<CONFIG:Release>:-Wl,-z,relro,-z,now>)
endif()

if(KPLIB_SANITIZE)
    set(CMAKE_CXX_FLAGS_RELEASE "-O1 -DNDEBUG")  # half the time to build, and another level for results to hold on
    add_compile_options(-fsanitize=${KPLIB_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer -g1)
    if(KPLIB_FUZZ)
        add_compile_options(-fsanitize=fuzzer-no-link)
    endif()
    add_link_options(-fsanitize=${KPLIB_SANITIZE})
endif()
