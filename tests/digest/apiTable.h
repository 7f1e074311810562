// SPDX-License-Identifier: MIT
//
// The functions of libraster as a table, so that the same case can be run on several copies of the
// library.

#ifndef TESTS_API_TABLE_H
#define TESTS_API_TABLE_H

#include "imageUtil.h"
#include "raster.h"
#include "rect.h"

// clang-format off
#define RASTER_API(X) \
  X(Raster_RectFill) X(Raster_RectCopy) X(Raster_RectFillAlpha) X(Raster_RectROPfill) \
  X(Raster_RectROPcopy) X(Raster_RectPixmapCopy) X(Raster_RectPixmapROPcopy) \
  X(RasterRectPixmapROPcopy8) X(RasterRectPixmapROPcopy16) X(RasterRectPixmapROPcopy24) \
  X(RasterRectPixmapROPcopy32) X(Raster_BitsToPixels) X(Raster_BitsToPixelsStencil) \
  X(RasterBitsToPixels8) X(RasterBitsToPixels16) X(RasterBitsToPixels24) X(RasterBitsToPixels32) \
  X(RasterBitsToPixelsStencil8) X(RasterBitsToPixelsStencil16) X(RasterBitsToPixelsStencil24) \
  X(RasterBitsToPixelsStencil32) X(Raster_IsModeReasonable) X(Raster_GetBPPDepth) \
  X(Raster_ConvertOnePixel) X(Raster_ConvertPixels) X(Raster_ConvertPixelsTo32) \
  X(Raster_ConvertPixelsFrom32) X(Raster_CopyPixels) X(Raster_ClearRectList) X(Raster_AddRect) \
  X(Raster_SubRect) X(Raster_ComparePixels) X(Raster_CompareRects) X(Raster_CompareMasked) \
  X(Raster_AlphaBlend) X(Raster_AlphaBlendOver) X(Raster_ScaleInit) X(Raster_ScaleExit) \
  X(Raster_Scale) X(Raster_ScaleSrcCoordinates) X(Raster_CalculateCursorSize) \
  X(Raster_ExpandCursorBitPlane) X(Raster_ExpandPlanarCursorData) X(Raster_ComputeCursorBox) \
  X(Raster_DrawCursor) X(Raster_GetScaledCursorSize) X(Raster_ScaleAlphaCursor) \
  X(Raster_ScaleColorCursor) X(Raster_YUVtoRGB) X(RasterRGB_YUVtoBGRX) X(RasterRGB_MakeRGBParam) \
  X(Raster_Compress) X(Raster_Decompress) X(Rect_SetFromXYWH) X(Rect_IsEqual) X(Rect_IsSizeEqual) \
  X(Rect_Translate) X(Rect_TranslateInv) X(Rect_Intersect) X(Rect_Union) X(Rect_ContainsRect) \
  X(Rect_ContainsPoint) X(Rect_Test) X(Rect_ApplyDiff) X(Rect_ApplyDiffEx) \
  X(Rect_ApplyDiffToPoint) X(Rect_IntersectPair) X(Rect_ScalePoint) X(Rect_PointDistance) \
  X(ImageUtil_ReadPNGBuffer) X(ImageUtil_FreeImageData) X(ImageUtil_ConstructPNGBuffer) \
  X(ImageUtil_ConstructPNGBufferWithMemOps) X(ImageUtil_ConstructBMPBuffer) X(ImageUtil_Combine) \
  X(ImageUtil_CropAndScaleImage)
// clang-format on

namespace tests {

struct Api {
#define RASTER_API_FIELD(name) decltype(&::name) name;
  RASTER_API(RASTER_API_FIELD)
#undef RASTER_API_FIELD
  uint32* mmxSwitch;
};

}  // namespace tests

#endif
