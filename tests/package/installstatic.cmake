# Installs the static library into a fresh folder. Only its package is configured anew: the archive of this build, which
# is of the same objects, stands in for compiling them once more.
set(folder ${WORK}/build)
file(REMOVE_RECURSE ${WORK})
execute_process(
    COMMAND ${CMAKE_COMMAND} -G Ninja -S ${SOURCE} -B ${folder} -D BUILD_SHARED_LIBS=OFF -D VELMORA_COMPANION=OFF -D VELMORA_PROGRAM=OFF
            -D CMAKE_CXX_COMPILER=${COMPILER}
    OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY
)
file(COPY_FILE ${ARCHIVE} ${folder}/libobd/libobd.a)
execute_process(COMMAND ${CMAKE_COMMAND} --install ${folder} --prefix ${STAGE} OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
