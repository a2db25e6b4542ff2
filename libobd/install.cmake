include(CMakePackageConfigHelpers)

install(TARGETS obd EXPORT velmoraTargets)
install(DIRECTORY include/obd include/tervex DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/velmora FILES_MATCHING PATTERN "*.h")
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
