# Warnings for our own code only: an interface target that is linked privately and never installed.
add_library(velmoraWarnings INTERFACE)
target_compile_options(
    velmoraWarnings
    INTERFACE -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wnon-virtual-dtor -Woverloaded-virtual
              $<$<BOOL:${VELMORA_WERROR}>:-Werror>
)
# g++ 12 takes "text" + std::string(...) for an overlapping copy at -O3 (GCC bug 105651).
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
    target_compile_options(velmoraWarnings INTERFACE -Wno-restrict)
endif()
