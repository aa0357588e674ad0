# The installed tree: libqorvex.so, headers, a CMake package, a pkg-config file, the two programs, and the sources
# of the client kit, which games link or copy.
include(GNUInstallDirs)
include(CMakePackageConfigHelpers)

set(_programs qorvex-player)
if(TARGET fresco-replay)
    list(APPEND _programs fresco-replay)
endif()
set_target_properties(${_programs} PROPERTIES INSTALL_RPATH "$ORIGIN/../${CMAKE_INSTALL_LIBDIR}")
install(TARGETS qorvex EXPORT qorvex-targets LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(TARGETS ${_programs} RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
install(DIRECTORY include/qorvex fresco/include/fresco DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} FILES_MATCHING
        PATTERN "*.h")
install(DIRECTORY host DESTINATION ${CMAKE_INSTALL_DATADIR}/qorvex FILES_MATCHING PATTERN "*.h" PATTERN "*.cpp")

set(_package ${CMAKE_INSTALL_LIBDIR}/cmake/qorvex)
install(EXPORT qorvex-targets NAMESPACE qorvex:: DESTINATION ${_package})
configure_package_config_file(cmake/qorvex-config.cmake.in ${CMAKE_BINARY_DIR}/qorvex-config.cmake
                              INSTALL_DESTINATION ${_package})
write_basic_package_version_file(${CMAKE_BINARY_DIR}/qorvex-config-version.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_BINARY_DIR}/qorvex-config.cmake ${CMAKE_BINARY_DIR}/qorvex-config-version.cmake
        DESTINATION ${_package})
configure_file(cmake/qorvex.pc.in ${CMAKE_BINARY_DIR}/qorvex.pc @ONLY)
install(FILES ${CMAKE_BINARY_DIR}/qorvex.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
