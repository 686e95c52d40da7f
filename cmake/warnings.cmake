# SPDX-License-Identifier: MIT
# Compiler settings that hold for everything built here.
add_compile_options(-Wall -Wextra -Wpedantic)
# What would be another number, or a fault, on a processor of another size. The tests say for themselves that they need
# not care (tests/CMakeLists.txt).
add_compile_options(-Wconversion -Wsign-conversion -Wcast-align$<$<CXX_COMPILER_ID:GNU>:=strict>)
if(TAVI_WERROR)
  add_compile_options(-Werror)
endif()
if(TAVI_SANITIZE)
  add_compile_options(-fsanitize=address,undefined -fno-sanitize-recover=undefined -fno-omit-frame-pointer)
  add_link_options(-fsanitize=address,undefined)
endif()
if(TAVI_FUZZ)
  add_compile_options(-fsanitize=fuzzer-no-link)
endif()
