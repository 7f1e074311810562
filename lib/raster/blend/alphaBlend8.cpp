// SPDX-License-Identifier: MIT
//
// Blending onto pixels of one byte.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/blend/alphaBlend8.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "blendKernels-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

constexpr FormatKernels kKernels[] = {kKernelsOf<Packed<Code6>>, kKernelsOf<Packed<Code8>>};

}  // namespace

const FormatKernels* kernels8() { return kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {

HWY_EXPORT(kernels8);
const FormatKernels* lookUpBlend8() { return HWY_DYNAMIC_DISPATCH(kernels8)(); }

}  // namespace raster

#endif
