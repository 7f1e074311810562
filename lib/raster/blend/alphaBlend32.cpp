// SPDX-License-Identifier: MIT
//
// Blending onto pixels of three and four bytes.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "raster/blend/alphaBlend32.cpp"
#include "vector/hwySetup.h"
#include "hwy/foreach_target.h"
#include "hwy/highway.h"

#include "blendKernels-inl.h"

HWY_BEFORE_NAMESPACE();
namespace raster::HWY_NAMESPACE {
const FormatKernels* kernels24() { return &kKernelsOf<Bytes3>; }
const FormatKernels* kernels32() { return &kKernelsOf<Bytes4>; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

#include "vector/kernelChoice.h"

namespace raster {
namespace {

HWY_EXPORT(kernels24);
HWY_EXPORT(kernels32);

const FormatKernels* lookUp24() { return HWY_DYNAMIC_DISPATCH(kernels24)(); }
const FormatKernels* lookUp32() { return HWY_DYNAMIC_DISPATCH(kernels32)(); }

}  // namespace

const FormatKernels& blendKernels24() { return chosenKernels<lookUp24>(); }
const FormatKernels& blendKernels32() { return chosenKernels<lookUp32>(); }

}  // namespace raster

#endif
