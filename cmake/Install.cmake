# What `cmake --install` puts where: libraries, public headers, pkg-config files, CMake package.
include(CMakePackageConfigHelpers)

install(TARGETS raster raster-checked tarnlibs EXPORT rasterTargets
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
set(RASTER_PUBLIC_HEADERS
  lib/raster/raster.h lib/raster/raster.hpp lib/raster/rasterExport.h
  ${RASTER_GENERATED_HEADERS}/rasterVersion.h lib/rect/rect.h lib/image/imageUtil.h
  lib/checked/rasterChecked.h
  lib/tarnlibs/baseTypes.h lib/tarnlibs/message.h lib/tarnlibs/utilAlloc.h
  lib/tarnlibs/dynBuf.h lib/tarnlibs/fileIO.h)
install(FILES ${RASTER_PUBLIC_HEADERS}
  DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/raster)

install(EXPORT rasterTargets NAMESPACE raster::
  DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/raster)
configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/rasterConfig.cmake.in
  ${PROJECT_BINARY_DIR}/rasterConfig.cmake
  INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/raster)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/rasterConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/rasterConfig.cmake ${PROJECT_BINARY_DIR}/rasterConfigVersion.cmake
  DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/raster)

# The pkg-config files find their tree from where they lie, so an installed tree can be moved; but in
# /usr they say so, and pkg-config leaves out what the compiler looks through anyway.
if(IS_ABSOLUTE ${CMAKE_INSTALL_LIBDIR} OR CMAKE_INSTALL_PREFIX STREQUAL "/usr")
  set(RASTER_PC_PREFIX ${CMAKE_INSTALL_PREFIX})
else()
  file(RELATIVE_PATH upward /${CMAKE_INSTALL_LIBDIR}/pkgconfig /)
  string(REGEX REPLACE "/$" "" upward "${upward}")
  set(RASTER_PC_PREFIX "\${pcfiledir}/${upward}")
endif()
foreach(folder IN ITEMS LIBDIR INCLUDEDIR)
  set(RASTER_PC_${folder} ${CMAKE_INSTALL_${folder}})
  if(NOT IS_ABSOLUTE ${CMAKE_INSTALL_${folder}})
    set(RASTER_PC_${folder} "\${prefix}/${CMAKE_INSTALL_${folder}}")
  endif()
endforeach()
foreach(package raster raster-checked tarnlibs)
  configure_file(${CMAKE_CURRENT_LIST_DIR}/${package}.pc.in ${PROJECT_BINARY_DIR}/${package}.pc @ONLY)
  install(FILES ${PROJECT_BINARY_DIR}/${package}.pc
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
endforeach()

install(DIRECTORY examples DESTINATION ${CMAKE_INSTALL_DOCDIR} PATTERN CMakeLists.txt EXCLUDE
  PATTERN readme.cmake EXCLUDE)
include(cmake/Docs.cmake)
