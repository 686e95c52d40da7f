# SPDX-License-Identifier: MIT
# libtaviwireless.so.4: the product, linked from the object libraries of its folders.
add_library(taviwireless SHARED cmake/record_layouts.cpp)
target_link_libraries(taviwireless PRIVATE
  tavi_usbmodem tavi_dbus
  tavi_wireless_names tavi_wireless_adapter tavi_wireless_station tavi_wireless_access_point)
# Whoever uses all public headers needs these, too. Those who want Wi-Fi alone do not, so the installed target goes
# without them, as taviwireless::wifi, and packaging/taviwirelessConfig.cmake adds them.
target_link_libraries(taviwireless PUBLIC
  $<BUILD_INTERFACE:tavi::core> $<BUILD_INTERFACE:tavi::sdk> $<BUILD_INTERFACE:PkgConfig::DBUS>)
target_include_directories(taviwireless PUBLIC
  $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}/include>
  $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)
set_target_properties(taviwireless PROPERTIES
  VERSION ${PROJECT_VERSION} SOVERSION ${PROJECT_VERSION_MAJOR} EXPORT_NAME wifi)
target_link_options(taviwireless PRIVATE
  LINKER:--version-script=${PROJECT_SOURCE_DIR}/cmake/exports.map
  LINKER:--as-needed) # of what pkg-config names, nothing that is not called
set_property(TARGET taviwireless PROPERTY LINK_DEPENDS ${PROJECT_SOURCE_DIR}/cmake/exports.map)
