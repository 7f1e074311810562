# The manual pages of the tool and its commands, made of its own help where help2man is, under the same
# option as the reference (cmake/Docs.cmake).
raster_find_docs_program(RASTER_HELP2MAN help2man "the tool's manual pages")
if(NOT RASTER_HELP2MAN)
  return()
endif()

set(makeManual ${PROJECT_SOURCE_DIR}/docs/reference/toolManual.sh)
set(examples ${PROJECT_SOURCE_DIR}/docs/tool.md)
set(pages ${RASTER_DOCS_FOLDER}/man/man1)
add_custom_command(OUTPUT ${RASTER_DOCS_FOLDER}/madeTool
  COMMAND sh ${makeManual} ${RASTER_HELP2MAN} $<TARGET_FILE:rastertool> ${PROJECT_VERSION} ${examples} ${pages}
  COMMAND ${CMAKE_COMMAND} -E touch ${RASTER_DOCS_FOLDER}/madeTool
  DEPENDS rastertool ${examples} ${makeManual}
  COMMENT "Making the tool's manual pages" VERBATIM)
add_custom_target(toolManual ALL DEPENDS ${RASTER_DOCS_FOLDER}/madeTool)
install(DIRECTORY ${pages} DESTINATION ${CMAKE_INSTALL_MANDIR})
