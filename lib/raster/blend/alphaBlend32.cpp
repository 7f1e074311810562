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
namespace {

constexpr FormatKernels kKernels[] = {kKernelsOf<Bytes3>, kKernelsOf<Bytes4>};

}  // namespace

const FormatKernels* kernels32() { return kKernels; }

}  // namespace raster::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE

namespace raster {

HWY_EXPORT(kernels32);
const FormatKernels* lookUpBlend32() { return HWY_DYNAMIC_DISPATCH(kernels32)(); }

}  // namespace raster

#endif
