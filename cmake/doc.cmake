# SPDX-License-Identifier: MIT
# ninja doc: the API reference, of the public headers. In doc/html, and as text: man -l doc/man/man3/wireless.h.3
find_program(DOXYGEN doxygen)
if(DOXYGEN)
  configure_file(docs/Doxyfile.in Doxyfile @ONLY)
  add_custom_target(doc COMMAND ${DOXYGEN} ${CMAKE_CURRENT_BINARY_DIR}/Doxyfile
                    WORKING_DIRECTORY ${PROJECT_SOURCE_DIR} VERBATIM)
endif()
