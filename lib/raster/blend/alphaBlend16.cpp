// SPDX-License-Identifier: MIT
//
// Blending onto pixels of two bytes.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/blend/alphaBlend16.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "blendKernels-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
namespace {

constexpr FormatKernels kKernels[] = {kKernelsOf<Packed<Code15>>, kKernelsOf<Packed<Code16>>};

}  // namespace

const FormatKernels* kernels16() { return kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {

HWY_EXPORT(kernels16);
const FormatKernels* lookUpBlend16() { return HWY_DYNAMIC_DISPATCH(kernels16)(); }

}  // namespace raster

#endif
