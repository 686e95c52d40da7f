# SPDX-License-Identifier: MIT
# find_package(taviwireless 4): taviwireless::taviwireless, for all public headers.
# With COMPONENTS wifi alone: taviwireless::wifi, for wireless.h, which needs no other package.
include(${CMAKE_CURRENT_LIST_DIR}/taviwirelessTargets.cmake)
set(taviwireless_wifi_FOUND TRUE)

if(NOT taviwireless_FIND_COMPONENTS STREQUAL "wifi" AND NOT TARGET taviwireless::taviwireless)
  include(CMakeFindDependencyMacro)
  find_dependency(PkgConfig)
  pkg_check_modules(TAVIWIRELESS_HEADERS REQUIRED IMPORTED_TARGET dbus-glib-1 dbus-1 jsoncpp)
  add_library(taviwireless::taviwireless INTERFACE IMPORTED)
  target_link_libraries(taviwireless::taviwireless INTERFACE taviwireless::wifi PkgConfig::TAVIWIRELESS_HEADERS)
  foreach(name tavisdk tavicore)
    if(TARGET taviwireless::${name})
      set(name taviwireless::${name})
    endif() # else the appliance's own
    target_link_libraries(taviwireless::taviwireless INTERFACE ${name})
  endforeach()
endif()
