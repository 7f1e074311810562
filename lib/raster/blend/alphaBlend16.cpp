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
const FormatKernels* kernels15() { return &kKernelsOf<Packed<Code15>>; }
const FormatKernels* kernels16() { return &kKernelsOf<Packed<Code16>>; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

#include "vector/kernelChoice.h"

namespace raster {
namespace {

HWY_EXPORT(kernels15);
HWY_EXPORT(kernels16);

const FormatKernels* lookUp15() { return HWY_DYNAMIC_DISPATCH(kernels15)(); }
const FormatKernels* lookUp16() { return HWY_DYNAMIC_DISPATCH(kernels16)(); }

}  // namespace

const FormatKernels& blendKernels15() { return chosenKernels<lookUp15>(); }
const FormatKernels& blendKernels16() { return chosenKernels<lookUp16>(); }

}  // namespace raster

#endif
