# The platform SDK: tavi::core, from the appliance's sysroot or from the host edition.
if(TAVI_SDK_ROOT)
  find_path(TAVICORE_INCLUDE tavicore/error.h PATHS ${TAVI_SDK_ROOT}
            PATH_SUFFIXES usr/include usr/local/include include NO_DEFAULT_PATH REQUIRED)
  find_library(TAVICORE_LIBRARY NAMES libtavicore.so.4 tavicore PATHS ${TAVI_SDK_ROOT}
               PATH_SUFFIXES usr/lib/${CMAKE_LIBRARY_ARCHITECTURE} usr/lib usr/local/lib/${CMAKE_LIBRARY_ARCHITECTURE}
                             usr/local/lib lib/${CMAKE_LIBRARY_ARCHITECTURE} lib
               NO_DEFAULT_PATH REQUIRED)
  add_library(tavicore SHARED IMPORTED)
  set_target_properties(tavicore PROPERTIES IMPORTED_LOCATION ${TAVICORE_LIBRARY}
                        INTERFACE_INCLUDE_DIRECTORIES ${TAVICORE_INCLUDE})
  message(STATUS "Platform SDK: ${TAVICORE_LIBRARY}")
else()
  add_subdirectory(platform/linux)
  message(STATUS "Platform SDK: host edition")
endif()
add_library(tavi::core ALIAS tavicore)
