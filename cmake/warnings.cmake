# Warnings for our own code only: an interface target that is linked privately and never installed.
add_library(velmoraWarnings INTERFACE)
target_compile_options(
    velmoraWarnings
    INTERFACE -Wall -Wextra -Wpedantic -Wconversion -Wnon-virtual-dtor -Woverloaded-virtual
              $<$<NOT:$<BOOL:$<TARGET_PROPERTY:UNITY_BUILD>>>:-Wshadow>
              $<$<BOOL:${VELMORA_WERROR}>:-Werror>
)
# Warnings of g++ 12's optimiser that it gives for plain standard library code: "text" + std::string(...) as an
# overlapping copy, the order of byte vectors as a read of too much memory, bytes put behind a vector of one as a copy out
# of bounds, and the move of a variant as a use of what is not set.
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
    target_compile_options(velmoraWarnings INTERFACE -Wno-restrict -Wno-stringop-overread -Wno-array-bounds
                                                     -Wno-maybe-uninitialized)
endif()
