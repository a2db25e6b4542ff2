# Hardens what is built, as far as compiler and linker can: position independent programs, relocations that are read-only
# from the start, guarded stacks, checked calls of the C library.
option(VELMORA_HARDENING "Harden what is built" ON)
include(CheckPIESupported)
check_pie_supported(LANGUAGES CXX)
if(NOT VELMORA_HARDENING)
    return()
endif()

include(CheckCXXCompilerFlag)
include(CheckLinkerFlag)
foreach(flag -fstack-protector-strong -fstack-clash-protection -fcf-protection=full)
    string(MAKE_C_IDENTIFIER "VELMORA_HAS${flag}" known)
    check_cxx_compiler_flag("-Werror ${flag}" ${known})
    if(${known})
        add_compile_options(${flag})
    endif()
endforeach()
foreach(flag relro now noexecstack)
    check_linker_flag(CXX "LINKER:-z,${flag}" VELMORA_LINKS_${flag})
    if(VELMORA_LINKS_${flag})
        add_link_options(LINKER:-z,${flag})
    endif()
endforeach()

# Fortified calls want an optimised build without sanitizers, and may have been asked for already by a distributor.
if(NOT VELMORA_SANITIZE AND NOT "${CMAKE_CXX_FLAGS} $ENV{CXXFLAGS} $ENV{CPPFLAGS}" MATCHES "_FORTIFY_SOURCE")
    add_compile_options("$<$<CONFIG:Release,RelWithDebInfo,MinSizeRel>:-U_FORTIFY_SOURCE;-D_FORTIFY_SOURCE=2>")
endif()
# The sanitizer builds see more than these.
add_compile_definitions($<$<CONFIG:Debug>:_GLIBCXX_ASSERTIONS>)
