# The headers of the modem service name types of dbus-glib.
include(CMakeFindDependencyMacro)
find_dependency(PkgConfig)
pkg_check_modules(DBUS REQUIRED IMPORTED_TARGET dbus-glib-1 dbus-1 gthread-2.0)
include(${CMAKE_CURRENT_LIST_DIR}/taviwirelessTargets.cmake)
