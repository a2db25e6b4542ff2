# The sanitizer presets' build type has no flags of its own: unoptimised objects without debug information build
# fastest, and the tests wait for nothing. The presets take clang, which builds with these checks in half of g++'s time.
if(VELMORA_SANITIZE)
    add_compile_options(-fsanitize=${VELMORA_SANITIZE} -fno-sanitize-recover=all)
    add_link_options(-fsanitize=${VELMORA_SANITIZE})
    if(VELMORA_SANITIZE MATCHES "thread" AND CMAKE_CXX_COMPILER_ID MATCHES Clang)
        # A test has an operator new of its own, behind that of clang's runtime.
        add_link_options(-Wl,--allow-multiple-definition)
    endif()
    find_program(VELMORA_MOLD mold) # links the large test programs four times as fast
    if(VELMORA_MOLD)
        add_link_options(-fuse-ld=mold)
    endif()
endif()

# Source names in log calls and reports are paths from the root of the tree.
add_compile_options(-ffile-prefix-map=${PROJECT_SOURCE_DIR}/=)

if(VELMORA_FUZZ)
    add_compile_options(-fsanitize=fuzzer-no-link)
endif()

# The builds under a sanitizer are made whole each time, and the files of a target together compile in a third to a half
# of the time that they take one by one. A name in an anonymous namespace must therefore be the only one of its kind in
# its target. That a local name hides one of another file means nothing there.
function(velmora_compile_together target)
    if(VELMORA_SANITIZE)
        set_target_properties(${target} PROPERTIES UNITY_BUILD ON UNITY_BUILD_BATCH_SIZE 16)
    endif()
endfunction()
