# What "cmake --install" installs: the library, the host edition of the SDK it runs on, headers,
# programs, a pkg-config file and a CMake package.
include(CMakePackageConfigHelpers)
set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/taviwireless)

install(TARGETS taviwireless EXPORT taviwireless)
install(DIRECTORY include/taviwireless DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
if(NOT TAVI_SDK_ROOT)
  install(TARGETS tavicore tavisdk EXPORT taviwireless)
  install(DIRECTORY platform/include/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
endif()
install(TARGETS taviwireless_cli)
if(TARGET modemsim)
  install(TARGETS modemsim)
  install(DIRECTORY sim/personalities/ DESTINATION ${CMAKE_INSTALL_DATADIR}/taviwireless/modemsim)
endif()

configure_file(packaging/taviwireless.pc.in taviwireless.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/taviwireless.pc
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
install(EXPORT taviwireless NAMESPACE taviwireless:: DESTINATION ${package_dir}
        FILE taviwirelessConfig.cmake)
write_basic_package_version_file(taviwirelessConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/taviwirelessConfigVersion.cmake
        DESTINATION ${package_dir})
