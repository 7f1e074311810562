// SPDX-License-Identifier: MIT
//
// The layout of every public record and the numbers behind the names, as C sees them, for 4-byte
// and 8-byte pointers. It compiles or it does not; there is nothing to run.

#include <stddef.h>

#include "imageUtil.h"
#include "raster.h"
#include "rasterChecked.h"

#define PTR sizeof(void*)
#define AT(record, field, offset) \
  _Static_assert(offsetof(record, field) == (offset), #record "." #field)
#define SIZE(record, size) _Static_assert(sizeof(record) == (size), #record)

_Static_assert(PTR == 4 || PTR == 8, "a word size that this library knows");

AT(Rect, left, 0);
AT(Rect, top, 4);
AT(Rect, right, 8);
AT(Rect, bottom, 12);
SIZE(Rect, 16);
AT(Point, x, 0);
AT(Point, y, 4);
SIZE(Point, 8);

AT(RectListEntry, x, 0);
AT(RectListEntry, y, 4);
AT(RectListEntry, width, 8);
AT(RectListEntry, height, 12);
SIZE(RectList, 16 * 16);

AT(RasterCursor, type, 0);
AT(RasterCursor, hotX, 4);
AT(RasterCursor, hotY, 8);
AT(RasterCursor, width, 12);
AT(RasterCursor, height, 16);
AT(RasterCursor, pixels, PTR == 4 ? 20 : 24);
AT(RasterCursor, depth, PTR == 4 ? 20 : 24);
AT(RasterCursor, bpp, PTR == 4 ? 24 : 28);
AT(RasterCursor, andMask, PTR == 4 ? 28 : 32);
AT(RasterCursor, xorMask, PTR == 4 ? 32 : 40);
SIZE(RasterCursor, PTR == 4 ? 36 : 48);

AT(RasterFrameBufferDesc, width, 0);
AT(RasterFrameBufferDesc, height, 4);
AT(RasterFrameBufferDesc, depth, 8);
AT(RasterFrameBufferDesc, bpp, 12);
AT(RasterFrameBufferDesc, pitch, 16);
SIZE(RasterFrameBufferDesc, 20);

AT(RasterCursorBox, x, 0);
AT(RasterCursorBox, y, 4);
AT(RasterCursorBox, width, 8);
AT(RasterCursorBox, height, 12);
AT(RasterCursorBox, srcX, 16);
AT(RasterCursorBox, srcY, 20);
SIZE(RasterCursorBox, 24);

AT(RasterRGBParam, multiplier, 0);
AT(RasterRGBParam, shift, 4);
AT(RasterRGBParam, mask, 8);
SIZE(RasterRGBParam, 12);

AT(ImageUtilColor, blue, 0);
AT(ImageUtilColor, green, 1);
AT(ImageUtilColor, red, 2);
AT(ImageUtilColor, reserved, 3);
SIZE(ImageUtilColor, 4);

AT(ImageUtilImage, width, 0);
AT(ImageUtilImage, height, 4);
AT(ImageUtilImage, depth, 8);
AT(ImageUtilImage, bpp, 12);
AT(ImageUtilImage, bytesPerLine, 16);
AT(ImageUtilImage, flags, 20);
AT(ImageUtilImage, numColors, 24);
AT(ImageUtilImage, palette, 28);
AT(ImageUtilImage, data, PTR == 4 ? 28 + 1024 : 1056);
SIZE(ImageUtilImage, PTR == 4 ? 1056 : 1064);

AT(ImageUtilPNGWriteParams, compressionLevel, 0);
AT(ImageUtilPNGWriteParams, stripAlpha, 4);
SIZE(ImageUtilPNGWriteParams, 8);

AT(ImageUtilMemOps, context, 0);
AT(ImageUtilMemOps, alloc, PTR);
AT(ImageUtilMemOps, free, 2 * PTR);
AT(ImageUtilMemOps, realloc, 3 * PTR);
SIZE(ImageUtilMemOps, 4 * PTR);

AT(ImageUtilReadPngCtx, start, 0);
AT(ImageUtilReadPngCtx, consumed, PTR);
SIZE(ImageUtilReadPngCtx, 2 * PTR);

AT(ImageUtilBufferWriteCtx, buffer, 0);
AT(ImageUtilBufferWriteCtx, used, PTR);
AT(ImageUtilBufferWriteCtx, capacity, PTR + 4);
AT(ImageUtilBufferWriteCtx, memops, PTR + 8);
SIZE(ImageUtilBufferWriteCtx, 2 * PTR + 8);

AT(DynBuf, data, 0);
AT(DynBuf, size, PTR);
AT(DynBuf, allocated, 2 * PTR);
SIZE(DynBuf, 3 * PTR);

_Static_assert(sizeof(uint8) == 1 && sizeof(int16) == 2 && sizeof(uint32) == 4, "base types");
_Static_assert(sizeof(int64) == 8 && sizeof(bool) == 1, "base types");
_Static_assert(IMAGE_FLAG_BOTTOM_UP == 1 && IMAGE_UTIL_READ_KEEP_ALPHA == 1, "flags");
_Static_assert(IMAGE_UTIL_TYPE_PNG == 0 && IMAGE_UTIL_TYPE_BMP == 1, "image types");
_Static_assert(RASTER_CURSOR_MASK == 0 && RASTER_CURSOR_ALPHA == 1, "cursor types");
_Static_assert(RASTER_RECT_LIST_SIZE == 16, "rect list");

#define IS(name, number) _Static_assert((name) == (number), #name)
#define FOUR(a, b, c, d) ((a) | (b) << 8 | (c) << 16 | (d) << 24)

/* The graphics-context functions of the X protocol, and the operators of its RENDER extension. */
IS(RASTER_ROP_CLEAR, 0x0);
IS(RASTER_ROP_AND, 0x1);
IS(RASTER_ROP_AND_REVERSE, 0x2);
IS(RASTER_ROP_COPY, 0x3);
IS(RASTER_ROP_AND_INVERTED, 0x4);
IS(RASTER_ROP_NOOP, 0x5);
IS(RASTER_ROP_XOR, 0x6);
IS(RASTER_ROP_OR, 0x7);
IS(RASTER_ROP_NOR, 0x8);
IS(RASTER_ROP_EQUIV, 0x9);
IS(RASTER_ROP_INVERT, 0xa);
IS(RASTER_ROP_OR_REVERSE, 0xb);
IS(RASTER_ROP_COPY_INVERTED, 0xc);
IS(RASTER_ROP_OR_INVERTED, 0xd);
IS(RASTER_ROP_NAND, 0xe);
IS(RASTER_ROP_SET, 0xf);
IS(RASTER_BLEND_CLEAR, 0);
IS(RASTER_BLEND_OVER, 3);
IS(RASTER_BLEND_IN, 5);
IS(RASTER_BLEND_OUT, 7);
IS(RASTER_BLEND_ATOP, 9);
IS(RASTER_BLEND_XOR, 11);
IS(RASTER_BLEND_ADD, 12);
IS(RASTER_BLEND_SATURATE, 13);
IS(RASTER_BLEND_USE_SRC_ALPHA, 1);
IS(RASTER_BLEND_USE_DST_ALPHA, 2);
IS(RASTER_VIDEO_YUY2, FOUR('Y', 'U', 'Y', '2'));
IS(RASTER_VIDEO_UYVY, FOUR('U', 'Y', 'V', 'Y'));
IS(RASTER_VIDEO_YV12, FOUR('Y', 'V', '1', '2'));
IS(RASTER_FORMAT_111, 3);
IS(RASTER_FORMAT_222, 6);
IS(RASTER_FORMAT_233, 8);
IS(RASTER_FORMAT_555, 15);
IS(RASTER_FORMAT_565, 16);
IS(RASTER_FORMAT_888, 24);
IS(RASTER_FORMAT_8888, 32);
AT(RasterView, data, 0);
AT(RasterView, bytes, PTR);
AT(RasterView, pitch, 2 * PTR);
AT(RasterView, width, 2 * PTR + 4);
AT(RasterView, height, 2 * PTR + 8);
AT(RasterView, depth, 2 * PTR + 12);
AT(RasterView, bpp, 2 * PTR + 16);
SIZE(RasterView, PTR == 4 ? 28 : 40);

AT(RasterLimits, width, 0);
AT(RasterLimits, height, 4);
AT(RasterLimits, pixelBytes, 8);
AT(RasterLimits, inputBytes, 16);
AT(RasterLimits, chunkBytes, 24);
AT(RasterLimits, chunks, 28);
SIZE(RasterLimits, 32);

SIZE(RasterStatus, 4);
SIZE(RasterBlend, 20);
SIZE(RasterScaledCursor, 28);
SIZE(RasterBlockInfo, 20);
SIZE(RasterPngInfo, 12);
