# Builds an example as a project of its own, which finds the installed package.
set(folder ${WORK}/${EXAMPLE})
file(REMOVE_RECURSE ${folder})
set(flags "-Wall -Wextra -Wpedantic -Wshadow -Wconversion -Werror")
if(SANITIZE)
    string(APPEND flags " -fsanitize=${SANITIZE}")
endif()
execute_process(
    COMMAND ${CMAKE_COMMAND} -G Ninja -S ${EXAMPLES}/${EXAMPLE} -B ${folder} -D CMAKE_PREFIX_PATH=${STAGE}
            -D CMAKE_CXX_COMPILER=${COMPILER} -D CMAKE_CXX_FLAGS=${flags}
    OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY
)
execute_process(COMMAND ${CMAKE_COMMAND} --build ${folder} COMMAND_ERROR_IS_FATAL ANY)
