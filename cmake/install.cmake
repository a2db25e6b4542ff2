# The package: libraries with their headers, the program, and what find_package needs. The components of an installation:
# Runtime, what programs need to run; Development, what they are built with; Program; Sim; Python.
include(CMakePackageConfigHelpers)
set(package_folder ${CMAKE_INSTALL_LIBDIR}/cmake/velmora)

# install(TARGETS) of a library in its two components: the link that linkers take is of no use at run time.
set(library_components LIBRARY COMPONENT Runtime NAMELINK_COMPONENT Development ARCHIVE COMPONENT Development)
install(TARGETS obd EXPORT velmoraObdTargets ${library_components})
install(
    DIRECTORY libobd/include/obd libobd/include/tervex
    DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/velmora
    COMPONENT Development
    FILES_MATCHING PATTERN "*.h"
)
install(EXPORT velmoraObdTargets NAMESPACE velmora:: DESTINATION ${package_folder} COMPONENT Development)

# What a static companion's users must link to as well: the compiled libraries of its parts, which an application finds
# anew. Each is named as its package and its target.
set(companion_packages)
set(companion_modules) # the same for pkg-config
if(TARGET velmoraLibrary)
    if(NOT BUILD_SHARED_LIBS)
        get_target_property(parts velmoraParts INTERFACE_LINK_LIBRARIES)
        foreach(part fmt::fmt tomlplusplus::tomlplusplus SQLite::SQLite3)
            if(part IN_LIST parts)
                string(REGEX REPLACE "::.*" "" package ${part})
                string(REPLACE "SQLite" "SQLite3" package ${package})
                list(APPEND companion_packages ${package})
                string(TOLOWER ${package} module)
                list(APPEND companion_modules ${module})
                target_link_libraries(velmoraLibrary PRIVATE $<INSTALL_INTERFACE:${part}>)
            endif()
        endforeach()
        # These have no packages of their own; every Debian linker finds them by their names.
        foreach(part mosquitto systemd)
            string(TOUPPER ${part}_LIBRARY library)
            if(${library} IN_LIST parts)
                target_link_libraries(velmoraLibrary PRIVATE $<INSTALL_INTERFACE:${part}>)
                list(APPEND companion_modules lib${part})
            endif()
        endforeach()
    endif()
    install(TARGETS velmoraLibrary EXPORT velmoraCompanionTargets ${library_components})
    install(
        DIRECTORY libvelmora/include/velmora bindings/c/include/velmora
        DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/velmora
        COMPONENT Development
        FILES_MATCHING PATTERN "*.h"
    )
    install(
        FILES ${PROJECT_BINARY_DIR}/generated/velmora/version.h
        DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/velmora/velmora
        COMPONENT Development
    )
    install(EXPORT velmoraCompanionTargets NAMESPACE velmora:: DESTINATION ${package_folder} COMPONENT Development)
endif()
# The simulator for the tests of programs: always static, for it has no stable face but its one header.
if(TARGET obdsim)
    install(TARGETS obdsim EXPORT velmoraSimTargets COMPONENT Sim)
    install(
        DIRECTORY simulator/include/obdsim
        DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/velmora
        COMPONENT Sim
        FILES_MATCHING PATTERN "*.h"
    )
    install(EXPORT velmoraSimTargets NAMESPACE velmora:: DESTINATION ${package_folder} COMPONENT Sim)
endif()
if(TARGET velmora)
    install(TARGETS velmora COMPONENT Program)
endif()

list(TRANSFORM companion_packages PREPEND "    find_dependency(" OUTPUT_VARIABLE companion_dependencies)
list(TRANSFORM companion_dependencies APPEND ")\n")
string(JOIN "" companion_dependencies ${companion_dependencies})
configure_package_config_file(
    ${PROJECT_SOURCE_DIR}/cmake/velmoraConfig.cmake.in ${PROJECT_BINARY_DIR}/velmoraConfig.cmake
    INSTALL_DESTINATION ${package_folder}
)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/velmoraConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(
    FILES ${PROJECT_BINARY_DIR}/velmoraConfig.cmake ${PROJECT_BINARY_DIR}/velmoraConfigVersion.cmake
    DESTINATION ${package_folder}
    COMPONENT Development
)
install(FILES LICENSE THIRD-PARTY-NOTICES DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT Runtime)
include(cmake/pkgconfig.cmake)
