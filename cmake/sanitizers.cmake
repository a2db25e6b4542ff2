# The sanitizer presets' build type has no flags of its own: unoptimised objects without debug information build
# fastest, and the tests wait for nothing.
if(VELMORA_SANITIZE)
    add_compile_options(-fsanitize=${VELMORA_SANITIZE} -fno-sanitize-recover=all)
    add_link_options(-fsanitize=${VELMORA_SANITIZE})
endif()

# Source names in log calls and reports are paths from the root of the tree.
add_compile_options(-ffile-prefix-map=${PROJECT_SOURCE_DIR}/=)

if(VELMORA_FUZZ)
    add_compile_options(-fsanitize=fuzzer-no-link)
endif()
