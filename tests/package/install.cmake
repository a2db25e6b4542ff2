# Installs the build into a fresh folder.
file(REMOVE_RECURSE ${STAGE})
execute_process(
    COMMAND ${CMAKE_COMMAND} --install ${BUILD_FOLDER} --prefix ${STAGE} OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY
)
