# Installs the static libraries into a fresh folder. Only their package is configured anew: the archives of this build,
# which are of the same objects, stand in for compiling them once more.
set(folder ${WORK}/build)
file(REMOVE_RECURSE ${WORK})
execute_process(
    COMMAND ${CMAKE_COMMAND} -G Ninja -S ${SOURCE} -B ${folder} -D BUILD_SHARED_LIBS=OFF -D VELMORA_PROGRAM=OFF -D VELMORA_PYTHON=OFF
            -D CMAKE_CXX_COMPILER=${COMPILER}
    OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY
)
file(COPY_FILE ${ARCHIVE} ${folder}/libobd/libobd.a)
file(COPY_FILE ${SIMULATOR} ${folder}/simulator/libobdsim.a)
file(WRITE ${WORK}/merge.mri "create ${folder}/libvelmora/libvelmora.a\naddlib ${COMPANION}\naddlib ${SIMULATOR}\nsave\nend\n")
execute_process(COMMAND ar -M INPUT_FILE ${WORK}/merge.mri COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${CMAKE_COMMAND} --install ${folder} --prefix ${STAGE} OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
