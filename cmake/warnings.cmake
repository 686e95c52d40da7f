# Compiler settings that hold for everything built here.
add_compile_options(-Wall -Wextra -Wpedantic)
if(TAVI_WERROR)
  add_compile_options(-Werror)
endif()
if(TAVI_SANITIZE)
  add_compile_options(-fsanitize=address,undefined -fno-sanitize-recover=undefined -fno-omit-frame-pointer)
  add_link_options(-fsanitize=address,undefined)
endif()
