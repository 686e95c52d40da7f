# SPDX-License-Identifier: MIT
# tavi_may_include(target folder...): the folders of this project that the target's sources may name in an #include, such
# as "base" for "base/unique_fd.h". No other folder is on the compiler's path, so a wrong arrow between folders ends
# the build. The table of docs/architecture.md says the same.
function(tavi_may_include target)
  foreach(folder ${ARGN})
    string(REPLACE "/" "-" name ${folder})
    set(seen_from ${CMAKE_BINARY_DIR}/folders/${name})
    cmake_path(GET folder PARENT_PATH parent)
    file(MAKE_DIRECTORY ${seen_from}/${parent})
    file(CREATE_LINK ${PROJECT_SOURCE_DIR}/${folder} ${seen_from}/${folder} SYMBOLIC)
    target_include_directories(${target} PRIVATE ${seen_from})
  endforeach()
endfunction()
