# What `cmake --install` leaves for others: libraries, headers and a CMake package "callcontrol".
include(CMakePackageConfigHelpers)
install(TARGETS ccplatform callcontrol callcontrol-testing EXPORT callcontrolTargets
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(EXPORT callcontrolTargets NAMESPACE callcontrol:: DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/callcontrol)
file(WRITE ${CMAKE_CURRENT_BINARY_DIR}/callcontrolConfig.cmake
    "include(CMakeFindDependencyMacro)\nfind_dependency(Threads)\n"
    "include(\${CMAKE_CURRENT_LIST_DIR}/callcontrolTargets.cmake)\n")
write_basic_package_version_file(${CMAKE_CURRENT_BINARY_DIR}/callcontrolConfigVersion.cmake
    COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/callcontrolConfig.cmake
    ${CMAKE_CURRENT_BINARY_DIR}/callcontrolConfigVersion.cmake
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/callcontrol)
