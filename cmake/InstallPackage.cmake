# What `cmake --install` leaves for others: libraries, headers, the test kit, a CMake package and pkg-config files. The
# folder may be moved afterwards.
include(CMakePackageConfigHelpers)
install(TARGETS ccplatform callcontrol callcontrol-diagnosis callcontrol-testing callcontrol-testing-new-sources
        callcontrol-testing-main-sources
    EXPORT callcontrolTargets
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(EXPORT callcontrolTargets NAMESPACE callcontrol:: DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/callcontrol)
configure_package_config_file(packaging/callcontrolConfig.cmake.in callcontrolConfig.cmake
    INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/callcontrol)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/callcontrolConfigVersion.cmake
    COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/callcontrolConfig.cmake ${PROJECT_BINARY_DIR}/callcontrolConfigVersion.cmake
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/callcontrol)

file(RELATIVE_PATH PREFIX_FROM_PC /${CMAKE_INSTALL_LIBDIR}/pkgconfig /)
string(REGEX REPLACE "/$" "" PREFIX_FROM_PC "${PREFIX_FROM_PC}")
set(packages callcontrol callcontrol-diagnosis callcontrol-testing)
if(CALLCONTROL_BUILD_GATEWAY)
    list(APPEND packages callcontrol-gateway)
endif()
foreach(package IN LISTS packages)
    configure_file(packaging/${package}.pc.in ${package}.pc @ONLY)
    install(FILES ${PROJECT_BINARY_DIR}/${package}.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
endforeach()

install(DIRECTORY examples/line DESTINATION ${CMAKE_INSTALL_DATADIR}/callcontrol/examples)
install(FILES examples/two_modules.cpp DESTINATION ${CMAKE_INSTALL_DATADIR}/callcontrol/examples)
install(FILES README.md LICENSE DESTINATION ${CMAKE_INSTALL_DOCDIR})
install(FILES docs/writing-a-module.md docs/event-loop.md docs/architecture.md docs/objects-of-a-call.svg
    docs/performance.md docs/diagnosis.md docs/testing.md
    DESTINATION ${CMAKE_INSTALL_DOCDIR}/docs) # where the README and they themselves look for each other
install(DIRECTORY docs/decisions DESTINATION ${CMAKE_INSTALL_DOCDIR}/docs)
