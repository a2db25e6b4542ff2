# The build type of the sanitizer presets: light optimisation keeps the instrumented tests fast.
set(CMAKE_CXX_FLAGS_SANITIZE "-O1 -g1 -fno-omit-frame-pointer" CACHE STRING "Flags of the Sanitize build type")

if(VELMORA_SANITIZE)
    add_compile_options(-fsanitize=${VELMORA_SANITIZE} -fno-sanitize-recover=all)
    add_link_options(-fsanitize=${VELMORA_SANITIZE})
endif()

# Source names in log calls and reports are paths from the root of the tree.
add_compile_options(-ffile-prefix-map=${PROJECT_SOURCE_DIR}/=)

if(VELMORA_FUZZ)
    add_compile_options(-fsanitize=fuzzer-no-link)
endif()
