# Shared by bench and speed: what is measured against, and held to which instruction set. To be
# sourced after common.sh.

# The peers; the 32-bit benchmarks have none.
needBenchPackages() {
  [ "$1" != x86_64 ] ||
    needPackages libpixman-1-dev libyuv-dev libsdl2-dev libswscale-dev libavutil-dev \
      libopencv-core-dev libopencv-imgproc-dev qt6-base-dev liblz4-dev libspng-dev zlib1g-dev
}

# Keeps the peers that listen to their environment from instruction sets above a level: OpenCV and
# pixman. The benchmarks do it with libyuv and swscale (bench/support/peers.h); SDL, lz4, libpng and
# spng have nothing above SSE2, and pixman nothing above SSSE3. Qt 6.4 does not take features away
# (QT_NO_CPU_FEATURE changes nothing there): it runs at its best, AVX2.
holdPeers() {
  local above512='AVX512F,AVX512CD,AVX512DQ,AVX512BW,AVX512VL,AVX512IFMA,AVX512VBMI,AVX512VBMI2'
  above512+=',AVX512VNNI,AVX512BITALG,AVX512VPOPCNTDQ,AVX512-COMMON,AVX512-SKX,AVX512-CNL'
  above512+=',AVX512-CLX,AVX512-ICL'
  local aboveSse4="AVX,AVX2,FP16,FMA3,$above512"
  unset OPENCV_CPU_DISABLE PIXMAN_DISABLE
  case $1 in
    avx2) export OPENCV_CPU_DISABLE=$above512 ;;
    sse4) export OPENCV_CPU_DISABLE=$aboveSse4 ;;
    scalar) export PIXMAN_DISABLE='mmx sse2 ssse3' ;;
  esac
}
