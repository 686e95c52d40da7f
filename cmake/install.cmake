# SPDX-License-Identifier: MIT
# What "cmake --install" installs: the library, the host edition of the SDK it runs on, headers,
# programs, what starts the daemon, a pkg-config file and a CMake package.
include(CMakePackageConfigHelpers)
set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/taviwireless)

set_target_properties(taviwireless PROPERTIES INSTALL_RPATH $ORIGIN)
install(TARGETS taviwireless EXPORT taviwireless)
install(DIRECTORY include/taviwireless DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
if(NOT TAVI_SDK_ROOT)
  set_target_properties(tavicore tavisdk PROPERTIES INSTALL_RPATH $ORIGIN)
  install(TARGETS tavicore tavisdk EXPORT taviwireless)
  install(DIRECTORY platform/include/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
endif()
install(TARGETS taviwireless_cli usbmodemd)
if(TARGET modemsim)
  install(TARGETS modemsim)
  install(DIRECTORY sim/personalities/ DESTINATION ${CMAKE_INSTALL_DATADIR}/taviwireless/modemsim)
endif()

install(EXPORT taviwireless NAMESPACE taviwireless:: DESTINATION ${package_dir}
        FILE taviwirelessTargets.cmake)
install(FILES packaging/taviwirelessConfig.cmake DESTINATION ${package_dir})
write_basic_package_version_file(taviwirelessConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/taviwirelessConfigVersion.cmake
        DESTINATION ${package_dir})
# What has to go with every copy, and programs to begin with.
install(FILES LICENSE THIRD-PARTY.md DESTINATION ${CMAKE_INSTALL_DOCDIR})
install(DIRECTORY LICENSES DESTINATION ${CMAKE_INSTALL_DOCDIR})
install(DIRECTORY examples DESTINATION ${CMAKE_INSTALL_DOCDIR} USE_SOURCE_PERMISSIONS)

# These hold the prefix, which "cmake --install --prefix" may still change: so they are written when
# the project is installed.
function(tavi_install_configured file folder)
  install(CODE "
    set(PROJECT_VERSION \"${PROJECT_VERSION}\")
    set(PROJECT_DESCRIPTION \"${PROJECT_DESCRIPTION}\")
    set(CMAKE_INSTALL_BINDIR \"${CMAKE_INSTALL_BINDIR}\")
    set(CMAKE_INSTALL_LIBDIR \"${CMAKE_INSTALL_LIBDIR}\")
    set(CMAKE_INSTALL_INCLUDEDIR \"${CMAKE_INSTALL_INCLUDEDIR}\")
    set(file \"\${CMAKE_INSTALL_PREFIX}/${folder}/${file}\")
    configure_file(\"${PROJECT_SOURCE_DIR}/packaging/${file}.in\" \"\$ENV{DESTDIR}\${file}\" @ONLY)
    list(APPEND CMAKE_INSTALL_MANIFEST_FILES \"\${file}\")")
endfunction()
tavi_install_configured(taviwireless.pc ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
tavi_install_configured(taviwireless-wifi.pc ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
tavi_install_configured(com.merilond.usbmodem.service share/dbus-1/services)
tavi_install_configured(com.merilond.usbmodem.Objects.service share/dbus-1/services)
install(FILES dbus/usbmodem.xml DESTINATION share/dbus-1/interfaces
        RENAME com.merilond.usbmodem.xml)
install(FILES daemon/modem_objects.xml DESTINATION share/dbus-1/interfaces
        RENAME com.merilond.usbmodem.Objects.xml)
tavi_install_configured(usbmodemd.service lib/systemd/user)
install(FILES packaging/taviwireless.tmpfiles.conf DESTINATION lib/tmpfiles.d
        RENAME taviwireless.conf)
install(FILES packaging/taviwireless.modules-load.conf DESTINATION lib/modules-load.d
        RENAME taviwireless.conf)
install(FILES packaging/taviwireless.bash DESTINATION share/bash-completion/completions
        RENAME taviwireless)
install(FILES packaging/taviwireless.zsh DESTINATION share/zsh/site-functions RENAME _taviwireless)
