# Which parts are built beside the libraries. RASTER_BUILD_<PART> is ON (what it needs must be there),
# OFF, or AUTO: built where all that it needs is there, else left out with a line that says what is
# missing. The result is RASTER_WITH_<PART>.

# raster_part(PART DESCRIPTION [HEADER DEBIAN-PACKAGE]...)
function(raster_part part description)
  set(default OFF)
  if(PROJECT_IS_TOP_LEVEL)
    set(default AUTO)
  endif()
  set(RASTER_BUILD_${part} ${default} CACHE STRING "Build ${description}: ON, OFF or AUTO")
  set(with ${RASTER_BUILD_${part}})
  if(with STREQUAL AUTO)
    set(with ON)
    set(missing)
    while(ARGN)
      list(POP_FRONT ARGN header package)
      string(MAKE_C_IDENTIFIER "RASTER_HAS_${header}" found)
      find_path(${found} ${header})
      mark_as_advanced(${found})
      if(NOT ${found})
        list(APPEND missing ${package})
      endif()
    endwhile()
    if(missing)
      list(JOIN missing ", " missing)
      message(STATUS "Without ${description}: not found here: ${missing}")
      set(with OFF)
    endif()
  endif()
  set(RASTER_WITH_${part} ${with} PARENT_SCOPE)
endfunction()

raster_part(TOOLS "rastertool"
  CLI/CLI.hpp libcli11-dev zlib.h zlib1g-dev xcb/xcb.h libxcb1-dev xcb/shm.h libxcb-shm0-dev
  xcb/xfixes.h libxcb-xfixes0-dev xcb/damage.h libxcb-damage0-dev xcb/xinput.h libxcb-xinput-dev
  xcb/xtest.h libxcb-xtest0-dev xcb/xcb_keysyms.h libxcb-keysyms1-dev)
raster_part(TESTS "the tests and the examples" gtest/gtest.h libgtest-dev)

# Shared unless the builder asks for static libraries in CMake's usual way.
set(RASTER_LIBRARY_KIND SHARED)
if(DEFINED BUILD_SHARED_LIBS AND NOT BUILD_SHARED_LIBS)
  set(RASTER_LIBRARY_KIND STATIC)
  if(RASTER_WITH_TESTS)
    message(STATUS "Without the tests and the examples: they are about shared libraries")
    set(RASTER_WITH_TESTS OFF)
  endif()
endif()
