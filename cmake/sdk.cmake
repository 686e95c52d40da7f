# SPDX-License-Identifier: MIT
# The platform SDK: tavi::core and tavi::sdk, from the appliance's sysroot or from the host edition.
function(tavi_find_sdk name header)
  find_path(${name}_INCLUDE ${header} PATHS ${TAVI_SDK_ROOT}
            PATH_SUFFIXES usr/include usr/local/include include NO_DEFAULT_PATH REQUIRED)
  find_library(${name}_LIBRARY NAMES lib${name}.so.4 ${name} PATHS ${TAVI_SDK_ROOT}
               PATH_SUFFIXES usr/lib/${CMAKE_LIBRARY_ARCHITECTURE} usr/lib
                             usr/local/lib/${CMAKE_LIBRARY_ARCHITECTURE} usr/local/lib
                             lib/${CMAKE_LIBRARY_ARCHITECTURE} lib
               NO_DEFAULT_PATH REQUIRED)
  add_library(${name} SHARED IMPORTED GLOBAL)
  set_target_properties(${name} PROPERTIES IMPORTED_LOCATION ${${name}_LIBRARY}
                        INTERFACE_INCLUDE_DIRECTORIES ${${name}_INCLUDE})
  message(STATUS "Platform SDK: ${${name}_LIBRARY}")
endfunction()

if(TAVI_SDK_ROOT)
  tavi_find_sdk(tavicore tavicore/error.h)
  tavi_find_sdk(tavisdk tavisdk/network.h)
else()
  add_subdirectory(platform/linux)
  message(STATUS "Platform SDK: host edition")
endif()
add_library(tavi::core ALIAS tavicore)
add_library(tavi::sdk ALIAS tavisdk)
