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
const FormatKernels* kernels6() { return &kKernelsOf<Packed<Code6>>; }
const FormatKernels* kernels8() { return &kKernelsOf<Packed<Code8>>; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

#include "vector/kernelChoice.h"

namespace raster {
namespace {

HWY_EXPORT(kernels6);
HWY_EXPORT(kernels8);

const FormatKernels* lookUp6() { return HWY_DYNAMIC_DISPATCH(kernels6)(); }
const FormatKernels* lookUp8() { return HWY_DYNAMIC_DISPATCH(kernels8)(); }

}  // namespace

const FormatKernels& blendKernels6() { return chosenKernels<lookUp6>(); }
const FormatKernels& blendKernels8() { return chosenKernels<lookUp8>(); }

}  // namespace raster

#endif
