# Configures a project with this one in its tree, by add_subdirectory and by FetchContent; compiles a file of it, and
# installs nothing.
foreach(fetch OFF ON)
    set(folder ${WORK}/guest${fetch})
    file(REMOVE_RECURSE ${folder})
    execute_process(
        COMMAND ${CMAKE_COMMAND} -G Ninja -S ${GUEST} -B ${folder} -D VELMORA=${SOURCE} -D FETCH=${fetch}
                -D CMAKE_CXX_COMPILER=${COMPILER}
        OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY
    )
    execute_process(COMMAND ${CMAKE_COMMAND} --build ${folder} --target CMakeFiles/app.dir/app.cpp.o COMMAND_ERROR_IS_FATAL ANY)
    execute_process(
        COMMAND ${CMAKE_COMMAND} --install ${folder} --prefix ${folder}/prefix OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY
    )
    file(GLOB_RECURSE installed ${folder}/prefix/*)
    if(installed)
        message(FATAL_ERROR "a guest has installed ${installed}")
    endif()
endforeach()
