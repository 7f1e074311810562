# 32-bit x86 with the host's own compiler. Libraries that Debian has no 64-bit package of are looked
# up in a private folder that scripts/build fills (RASTER_I386_ROOT), then in the system.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR i686)
set(CMAKE_CROSSCOMPILING_EMULATOR "")

set(CMAKE_C_FLAGS_INIT "-m32")
set(CMAKE_CXX_FLAGS_INIT "-m32")

if(NOT DEFINED RASTER_I386_ROOT)
  set(RASTER_I386_ROOT ${CMAKE_CURRENT_LIST_DIR}/../.deps/i386)
endif()
get_filename_component(RASTER_I386_ROOT ${RASTER_I386_ROOT} REALPATH)

set(CMAKE_LIBRARY_ARCHITECTURE i386-linux-gnu)
set(CMAKE_PREFIX_PATH ${RASTER_I386_ROOT}/usr)
set(CMAKE_SYSTEM_LIBRARY_PATH /usr/lib32)
set(CMAKE_IGNORE_PATH /usr/lib/x86_64-linux-gnu /lib/x86_64-linux-gnu)
set(CMAKE_IGNORE_PREFIX_PATH /usr/lib/x86_64-linux-gnu)

# DT_RPATH, not DT_RUNPATH: the libraries of the private folder also find one another there.
foreach(kind EXE SHARED MODULE)
  set(CMAKE_${kind}_LINKER_FLAGS_INIT
      "-m32 -Wl,--disable-new-dtags -Wl,-rpath-link,${RASTER_I386_ROOT}/usr/lib/i386-linux-gnu")
endforeach()
