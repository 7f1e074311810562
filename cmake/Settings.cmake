# What every target of this project is compiled with. Nothing here is global: a parent project that
# adds this one as a subdirectory keeps its own flags.

add_library(raster_settings INTERFACE)
target_compile_features(raster_settings INTERFACE cxx_std_20 c_std_11)
target_compile_options(raster_settings INTERFACE
  -Wall -Wextra -Wconversion -Wshadow -Wcast-align$<$<CXX_COMPILER_ID:GNU>:=strict> -Wvla -Wundef
  -Wpointer-arith
  $<$<CXX_COMPILER_ID:Clang>:-Wno-sign-conversion>  # which -Wconversion has there only
  $<$<COMPILE_LANGUAGE:CXX>:-Wnon-virtual-dtor -Wold-style-cast>
  -ffp-contract=off -fno-common)
if(RASTER_WERROR)
  target_compile_options(raster_settings INTERFACE -Werror)
endif()
target_link_options(raster_settings INTERFACE -Wl,--as-needed -Wl,-z,noexecstack)
if(CMAKE_SIZEOF_VOID_P EQUAL 4)
  # The same IEEE double arithmetic on both word sizes, and 64-bit file offsets.
  target_compile_options(raster_settings INTERFACE -msse2 -mfpmath=sse)
  target_compile_definitions(raster_settings INTERFACE _FILE_OFFSET_BITS=64)
endif()
if(RASTER_SANITIZE)
  # Reports need line numbers only, which take a third less time to compile.
  target_compile_options(raster_settings INTERFACE
    -fsanitize=${RASTER_SANITIZERS} -fno-sanitize-recover=all -fno-omit-frame-pointer -g1)
  target_link_options(raster_settings INTERFACE -fsanitize=${RASTER_SANITIZERS})
endif()

if(RASTER_HARDENED)
  target_compile_options(raster_settings INTERFACE
    -fstack-protector-strong -fstack-clash-protection -fcf-protection=full -U_FORTIFY_SOURCE -D_FORTIFY_SOURCE=2)
  target_link_options(raster_settings INTERFACE -Wl,-z,relro -Wl,-z,now)
endif()

if(RASTER_BUILD_FUZZ)
  target_compile_options(raster_settings INTERFACE -fsanitize=fuzzer-no-link)
endif()

# The shared libraries.
add_library(raster_library_settings INTERFACE)
target_link_libraries(raster_library_settings INTERFACE raster_settings)
target_compile_options(raster_library_settings INTERFACE
  -fvisibility=hidden
  $<$<COMPILE_LANGUAGE:CXX>:-fvisibility-inlines-hidden -fno-exceptions -fno-rtti>)
target_link_options(raster_library_settings INTERFACE
  -static-libgcc -Wl,-z,text -Wl,-z,relro -Wl,-z,now)
if(NOT RASTER_SANITIZE)
  target_link_options(raster_library_settings INTERFACE -Wl,-z,defs)
endif()
if(CMAKE_SIZEOF_VOID_P EQUAL 4)
  # Callers built for the old i386 ABI enter with a stack aligned to 4 bytes only.
  target_compile_options(raster_library_settings INTERFACE
    $<IF:$<CXX_COMPILER_ID:Clang>,-mstackrealign,-mincoming-stack-boundary=2>)
endif()

# Sources with vector code: all of SSSE3, SSE4, AVX2 and AVX3 on both word sizes, and one-lane
# SCALAR as the fallback and reference. Highway keeps some of these back on 32-bit x86; they pass
# every test here (lib/raster/vector/hwySetup.h has the one function that is missing). F16C is not
# needed, and not every compiler can ask for it.
add_library(raster_highway INTERFACE)
target_compile_definitions(raster_highway INTERFACE
  HWY_BROKEN_TARGETS=HWY_EMU128 HWY_BROKEN_EMU128=1 HWY_DISABLE_F16C)
if(RASTER_SANITIZE)
  # Instrumented vector code takes minutes to compile; the middle levels are left to the other builds.
  target_compile_definitions(raster_highway INTERFACE "HWY_DISABLED_TARGETS=(HWY_SSSE3|HWY_SSE4)")
endif()
find_path(HIGHWAY_INCLUDE_DIR hwy/highway.h REQUIRED)
target_include_directories(raster_highway SYSTEM INTERFACE ${HIGHWAY_INCLUDE_DIR})
