# Warnings for our own code only: an interface target that is linked privately and never installed.
add_library(velmoraWarnings INTERFACE)
target_compile_options(
    velmoraWarnings
    INTERFACE -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wnon-virtual-dtor -Woverloaded-virtual
              $<$<BOOL:${VELMORA_WERROR}>:-Werror>
)
