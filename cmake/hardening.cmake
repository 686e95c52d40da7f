# SPDX-License-Identifier: MIT
# What makes a fault in memory end the program rather than give it away. Debian's packages are built with the same.
include(CheckPIESupported)
check_pie_supported()
add_compile_options(-fstack-protector-strong)
# Needs the optimiser, and says so. A sanitizer looks for itself.
if(NOT TAVI_SANITIZE)
  add_compile_definitions($<$<CONFIG:Release,RelWithDebInfo,MinSizeRel>:_FORTIFY_SOURCE=2>)
endif()
add_link_options(LINKER:-z,relro,-z,now)
