include(CMakePackageConfigHelpers)

install(TARGETS obd EXPORT velmoraTargets)
install(DIRECTORY include/obd DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/velmora FILES_MATCHING PATTERN "*.h")
# The public face is built on these templates of the common room.
install(
    FILES ${PROJECT_SOURCE_DIR}/common/event.h
          ${PROJECT_SOURCE_DIR}/common/ieventlistener.h
          ${PROJECT_SOURCE_DIR}/common/ieventproducer.h
          ${PROJECT_SOURCE_DIR}/common/inotifier.h
          ${PROJECT_SOURCE_DIR}/common/notifier.h
          ${PROJECT_SOURCE_DIR}/common/observer.h
    DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/velmora/common
)
install(
    EXPORT velmoraTargets
    NAMESPACE velmora::
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/velmora
)
configure_package_config_file(
    ${PROJECT_SOURCE_DIR}/cmake/velmoraConfig.cmake.in ${PROJECT_BINARY_DIR}/velmoraConfig.cmake
    INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/velmora
)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/velmoraConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(
    FILES ${PROJECT_BINARY_DIR}/velmoraConfig.cmake ${PROJECT_BINARY_DIR}/velmoraConfigVersion.cmake
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/velmora
)
