# The reference: HTML and man pages made from the public headers, where Doxygen is, and raster(7), which
# is written by hand. RASTER_BUILD_DOCS is ON, OFF, or AUTO: made where Doxygen is there.
set(RASTER_BUILD_DOCS AUTO CACHE STRING "Make the reference pages: ON, OFF or AUTO")
set(RASTER_DOCS_FOLDER ${PROJECT_BINARY_DIR}/docs)

set(RASTER_DOCS_INPUT)
foreach(header IN LISTS RASTER_PUBLIC_HEADERS)
  get_filename_component(header ${header} ABSOLUTE BASE_DIR ${PROJECT_SOURCE_DIR})
  string(APPEND RASTER_DOCS_INPUT " \"${header}\"")
endforeach()
configure_file(docs/reference/Doxyfile.in ${RASTER_DOCS_FOLDER}/Doxyfile @ONLY)
configure_file(docs/reference/raster.7.in ${RASTER_DOCS_FOLDER}/man/man7/raster.7 @ONLY)
install(FILES ${RASTER_DOCS_FOLDER}/man/man7/raster.7 DESTINATION ${CMAKE_INSTALL_MANDIR}/man7)

# Finds the program that makes `pages`. The variable is false where they are not wanted, or not made
# for the lack of it.
macro(raster_find_docs_program variable program pages)
  if(RASTER_BUILD_DOCS)
    find_program(${variable} ${program})
    mark_as_advanced(${variable})
    if(NOT ${variable})
      if(NOT RASTER_BUILD_DOCS STREQUAL AUTO)
        message(FATAL_ERROR "RASTER_BUILD_DOCS: ${program} was not found")
      endif()
      message(STATUS "Without ${pages}: not found here: ${program}")
    endif()
  else()
    set(${variable} "")
  endif()
endmacro()

raster_find_docs_program(RASTER_DOXYGEN doxygen "the reference pages")
if(NOT RASTER_DOXYGEN)
  return()
endif()

set(makeReference ${PROJECT_SOURCE_DIR}/docs/reference/make.sh)
add_custom_command(OUTPUT ${RASTER_DOCS_FOLDER}/made
  COMMAND sh ${makeReference} ${RASTER_DOXYGEN} ${RASTER_DOCS_FOLDER}
  COMMAND ${CMAKE_COMMAND} -E touch ${RASTER_DOCS_FOLDER}/made
  DEPENDS ${RASTER_PUBLIC_HEADERS} docs/reference/main.dox ${RASTER_DOCS_FOLDER}/Doxyfile ${makeReference}
  COMMENT "Making the reference pages" VERBATIM)
add_custom_target(docs ALL DEPENDS ${RASTER_DOCS_FOLDER}/made)

install(DIRECTORY ${RASTER_DOCS_FOLDER}/man/man3 DESTINATION ${CMAKE_INSTALL_MANDIR})
install(DIRECTORY ${RASTER_DOCS_FOLDER}/html DESTINATION ${CMAKE_INSTALL_DOCDIR})
