// SPDX-License-Identifier: MIT
/// \file
/// Raster graphics for bytes of others: the functions of raster.h and imageUtil.h behind checks.
///
/// For servers, viewers and tools whose frame buffers, pictures, sizes or coordinates come from
/// outside. Every function says in a RasterStatus what it did; once nothing is left to object to,
/// it calls the function of raster.h or imageUtil.h that its comment names, so the pixels are the
/// same.
///
/// What holds for every function here:
/// - Nothing is written to any output unless the result is RASTER_STATUS_OK.
/// - Any argument may have any value: no Panic, no signal, no message on standard error. Pointers
///   that are not null must point to what the function says, and memory that a view describes must
///   be there; everything else is checked.
/// - Every allocation may fail (RASTER_STATUS_NO_MEMORY). Memory that is handed out comes from
///   malloc; the caller releases it with free (ImageUtil_FreeImageData does the same for images).
/// - No function keeps state or takes a lock; calls on disjoint memory may run on several threads.
///
/// Rectangles are given as a Rect (right and bottom exclusive) of the destination; a null pointer
/// stands for the whole view. One that is empty draws nothing and is RASTER_STATUS_OK. One that
/// reaches out of the view is refused, or clipped where `flags` has RASTER_CHECKED_CLIP: the parts
/// outside are then left out, on both sides of a copy, and a call of which nothing is left does
/// nothing. Other bits of `flags` are refused.

#ifndef RASTER_CHECKED_H
#define RASTER_CHECKED_H

#include "baseTypes.h"
#include "imageUtil.h"
#include "raster.h"
#include "rasterExport.h"
#include "rect.h"

#ifdef __cplusplus
extern "C" {
#endif

// NOLINTBEGIN(modernize-use-using): this header is C as well

/// \defgroup raster_checked Checked calls
/// @{

// ---- Results -----------------------------------------------------------------------------------

/// What became of a call. Numbers do not change; new ones may be added at the end.
typedef enum RasterStatus {
  RASTER_STATUS_OK = 0,
  RASTER_STATUS_NULL = 1,          ///< a pointer is null that must not be
  RASTER_STATUS_BAD_ARGUMENT = 2,  ///< a number that the function has no meaning for
  RASTER_STATUS_BAD_VIEW = 3,      ///< a view whose rows do not lie in its bytes
  RASTER_STATUS_BAD_FORMAT = 4,    ///< a pixel format that does not exist or does not go here
  RASTER_STATUS_OUTSIDE = 5,       ///< a rectangle reaches out of its view
  RASTER_STATUS_OVERLAP = 6,       ///< two pieces of memory overlap that must not
  RASTER_STATUS_TOO_BIG = 7,       ///< a result that its format or record cannot hold
  RASTER_STATUS_LIMIT = 8,         ///< more than the limits allow
  RASTER_STATUS_TRUNCATED = 9,     ///< the bytes end before what they promise
  RASTER_STATUS_DAMAGED = 10,      ///< the bytes contradict themselves
  RASTER_STATUS_NOT_PNG = 11,      ///< the bytes are something else than a PNG picture
  RASTER_STATUS_UNSUPPORTED = 12,  ///< valid, but of a kind that was not asked for
  RASTER_STATUS_NO_MEMORY = 13,
  RASTER_STATUS_NOT_FOUND = 14,      ///< the file, or a folder on the way to it
  RASTER_STATUS_NO_PERMISSION = 15,  ///< to read or write the file or its folder
  RASTER_STATUS_NOT_REGULAR = 16,    ///< a folder, a pipe, a device: anything but a plain file
  RASTER_STATUS_EXISTS = 17,         ///< the file is there and may not be replaced
  RASTER_STATUS_NO_SPACE = 18,       ///< on the file's device, or in a quota or size limit
  RASTER_STATUS_FILE = 19            ///< another error of the file system
} RasterStatus;

/// A short English text for a status, without a line end; "unknown status" for other numbers. The
/// text is constant.
RASTER_EXPORT const char* RasterChecked_Text(RasterStatus status);

// ---- Limits ------------------------------------------------------------------------------------

/// What bytes from outside may ask for. Where a function takes a pointer to limits, null stands for
/// the defaults.
typedef struct RasterLimits {
  uint32 width;       ///< of a picture, in pixels; default 16384
  uint32 height;      ///< default 16384
  uint64 pixelBytes;  ///< of a picture's rows in memory; default 256 MiB
  uint64 inputBytes;  ///< of a file, a stream or a block; default 256 MiB
  uint32 chunkBytes;  ///< of any PNG chunk that does not hold pixels; default 8 MiB
  uint32 chunks;      ///< PNG chunks that do not hold pixels; default 1000
} RasterLimits;

/// Stores the default limits. A null pointer does nothing.
RASTER_EXPORT void RasterChecked_DefaultLimits(RasterLimits* limits);

// ---- Views -------------------------------------------------------------------------------------

/// A frame buffer and the memory that it lies in. Views of sources are not written through, and
/// none is kept after a call.
///
/// The formats (depth/bpp) are 3/8, 6/8, 8/8, 15/16, 16/16, 24/24, 24/32, and for bit planes 1/1
/// (rows of whole bytes, the most significant bit first). A view is valid when its format is one of
/// these, width and height are below 2^31, the pitch is at most 2^31 - 1 and at least a row of
/// `width` pixels, for pixels of 2 and 4 bytes also a multiple of that size, and all rows, the last
/// one without the gap behind it, lie in `bytes`. A view of no pixels may have null data.
typedef struct RasterView {
  uint8* data;    ///< the first byte of the top row, at any alignment
  size_t bytes;   ///< from there on
  uint32 pitch;   ///< bytes from one row to the next
  uint32 width;   ///< in pixels
  uint32 height;  ///< in rows
  uint32 depth;   ///< colour depth in bits
  uint32 bpp;     ///< bits per pixel
} RasterView;

/// Whether a view is valid: OK, NULL, BAD_FORMAT or BAD_VIEW. Every function that takes a view
/// makes this check itself.
RASTER_EXPORT RasterStatus RasterChecked_View(const RasterView* view);

/// Describes the pixels of an image whose `data` holds `bytes` bytes. Images of 8 bpp have the
/// depth 8 (or 3 or 6). The flag IMAGE_FLAG_BOTTOM_UP is not looked at: row 0 is the first row in
/// memory.
RASTER_EXPORT RasterStatus RasterChecked_ImageView(const ImageUtilImage* image, size_t bytes,
                                                   RasterView* view);

/// In `flags` of the functions that draw or compare: what lies outside is left out.
enum { RASTER_CHECKED_CLIP = 1 };

// ---- Rectangles --------------------------------------------------------------------------------

/// Raster_RectFill: stores `pixel` in every pixel of a rectangle.
RASTER_EXPORT RasterStatus RasterChecked_Fill(const RasterView* dst, const Rect* rect, uint32 pixel,
                                              uint32 flags);

/// Raster_RectFillAlpha: sets the fourth byte of every pixel of a rectangle. 24/32 only.
RASTER_EXPORT RasterStatus RasterChecked_FillAlpha(const RasterView* dst, const Rect* rect,
                                                   uint8 alpha, uint32 flags);

/// Raster_RectROPfill: combines `pixel` with a rectangle through operation `rop`, one of
/// RASTER_ROP_....
RASTER_EXPORT RasterStatus RasterChecked_RopFill(const RasterView* dst, const Rect* rect,
                                                 uint32 pixel, uint32 rop, uint32 flags);

/// Raster_RectCopy: copies the rectangle at (srcX, srcY) of `src` to `rect` of `dst`. Both have the
/// same bpp. Where source and destination overlap in memory, both views must have the same `data`
/// and pitch.
RASTER_EXPORT RasterStatus RasterChecked_Copy(const RasterView* dst, const Rect* rect,
                                              const RasterView* src, int32 srcX, int32 srcY,
                                              uint32 flags);

/// Raster_RectROPcopy: as RasterChecked_Copy through operation `rop`, one of
/// RASTER_ROP_....
RASTER_EXPORT RasterStatus RasterChecked_RopCopy(const RasterView* dst, const Rect* rect,
                                                 const RasterView* src, int32 srcX, int32 srcY,
                                                 uint32 rop, uint32 flags);

/// Raster_RectPixmapROPcopy: combines a pixmap, repeated endlessly, with a rectangle through
/// operation `rop`, one of RASTER_ROP_.... Pixel (tileX mod width, tileY mod height) of the pixmap
/// falls on the top left of `rect`, clipped or not. Both have the same bpp; the pixmap has at least
/// one pixel. `tileX` and `tileY` may be negative. The pixmap must not overlap the rectangle.
RASTER_EXPORT RasterStatus RasterChecked_Tile(const RasterView* dst, const Rect* rect,
                                              const RasterView* pixmap, int32 tileX, int32 tileY,
                                              uint32 rop, uint32 flags);

/// Raster_BitsToPixels: writes `foreground` where a bit of `plane` (a view of 1/1) is set and
/// `background` where it is clear. (srcX, srcY) of the plane falls on the top left of `rect`. The
/// plane must not overlap the rectangle.
RASTER_EXPORT RasterStatus RasterChecked_Bits(const RasterView* dst, const Rect* rect,
                                              const RasterView* plane, int32 srcX, int32 srcY,
                                              uint32 foreground, uint32 background, uint32 flags);

/// Raster_BitsToPixelsStencil: as RasterChecked_Bits; pixels of clear bits stay.
RASTER_EXPORT RasterStatus RasterChecked_BitsStencil(const RasterView* dst, const Rect* rect,
                                                     const RasterView* plane, int32 srcX,
                                                     int32 srcY, uint32 foreground, uint32 flags);

/// Raster_ConvertPixels: converts the rectangle at (srcX, srcY) of `src` to the format of `dst`,
/// which must not overlap it.
///
/// With a null `palette` the source is true colour: 15/16, 16/16, 24/24, 24/32, or the format of
/// the destination. Otherwise it has 8 bpp and `colors` is the length of the palette, whose entries
/// are 0xAARRGGBB; pixels beyond it are 0 (transparent black).
RASTER_EXPORT RasterStatus RasterChecked_Convert(const RasterView* dst, const Rect* rect,
                                                 const RasterView* src, int32 srcX, int32 srcY,
                                                 const uint32* palette, uint32 colors,
                                                 uint32 flags);

/// How RasterChecked_Blend composites; the fields are those arguments of Raster_AlphaBlend.
typedef struct RasterBlend {
  uint32 op;        ///< the operator, one of RASTER_BLEND_...
  uint32 flags;     ///< RASTER_BLEND_USE_...; no other bits
  uint32 srcAlpha;  ///< 0 to 255
  uint32 dstAlpha;  ///< 0 to 255; used, it is not 0 for RASTER_BLEND_SATURATE
  uint32 staged;    ///< 0 or 1
} RasterBlend;

/// Raster_AlphaBlend: composites the rectangle at (srcX, srcY) of `src`, a view of 24/32 with alpha
/// in byte 3, onto `rect` of `dst`, which may have any format but 3/8 and 1/1. A null `blend`
/// stands for Over without constant alphas (Raster_AlphaBlendOver).
RASTER_EXPORT RasterStatus RasterChecked_Blend(const RasterView* dst, const Rect* rect,
                                               const RasterView* src, int32 srcX, int32 srcY,
                                               const RasterBlend* blend, uint32 flags);

/// Raster_Scale: draws `rect` of the picture that is `src` enlarged by `scaleX` and `scaleY`
/// (destination pixels per source pixel; finite, above 1/32767); (0, 0) of that picture is (0, 0)
/// of `dst`. `smooth` 0 takes the nearest pixel, 1 interpolates and averages.
///
/// Both formats are equal and one of 8/8, 16/16, 24/24 and 24/32, or they are 24/32 onto 16/16 or
/// 24/24. Sizes are below 32768. The views must not overlap.
RASTER_EXPORT RasterStatus RasterChecked_Scale(const RasterView* dst, const Rect* rect,
                                               const RasterView* src, double scaleX, double scaleY,
                                               uint32 smooth, uint32 flags);

// ---- Comparison --------------------------------------------------------------------------------

/// Raster_ComparePixels: compares `rect` of `a` with the rectangle at (bX, bY) of `b`, of the same
/// bpp. `*difference` becomes 0 when they are equal, otherwise negative or positive as for memcmp.
RASTER_EXPORT RasterStatus RasterChecked_Compare(const RasterView* a, const Rect* rect,
                                                 const RasterView* b, int32 bX, int32 bY,
                                                 uint32 flags, int32* difference);

/// Raster_CompareRects: compares every rectangle of a list at the same place in both views. At most
/// the 16 entries of the list are looked at.
RASTER_EXPORT RasterStatus RasterChecked_CompareRects(const RasterView* a, const RasterView* b,
                                                      const RectList* list, uint32 flags,
                                                      int32* difference);

/// Raster_CompareMasked: whether two images agree under a mask but for `maxDiffs` pixels' worth of
/// bytes (not negative). The three views have the same size, format and pitch, and no gaps between
/// rows.
RASTER_EXPORT RasterStatus RasterChecked_CompareMasked(const RasterView* a, const RasterView* b,
                                                       const RasterView* mask, int32 maxDiffs,
                                                       bool* agree);

// ---- Rect lists --------------------------------------------------------------------------------

// A list is valid when its entries up to the first one whose width is not positive have positive
// heights and, with the rectangle of the call, lie in a box whose sides fit 32 bits; otherwise the
// status is BAD_ARGUMENT. Entries behind the end do not count, and are zero in the result. A list
// whose 16 entries are all in use is TOO_BIG, since a region has room for 15.

/// Raster_AddRect: adds a rectangle to the region of a list. A region of more than 15 rectangles
/// becomes its bounding box. Sizes must not be negative; with one of 0 the list stays as it is.
/// `area` (may be null) receives the number of pixels, modulo 2^32; 0 where a size is 0.
RASTER_EXPORT RasterStatus RasterChecked_AddRect(RectList* list, int32 x, int32 y, int32 width,
                                                 int32 height, uint32* area);

/// Raster_SubRect: takes a rectangle out of the region of a list. TOO_BIG where more than 15
/// rectangles would be left; the list is as it was then. Otherwise as RasterChecked_AddRect.
RASTER_EXPORT RasterStatus RasterChecked_SubRect(RectList* list, int32 x, int32 y, int32 width,
                                                 int32 height, uint32* area);

// ---- Cursors -----------------------------------------------------------------------------------

/// Raster_ExpandPlanarCursorData: stores the AND plane and behind it the XOR plane of a cursor in
/// `dst`, expanded from bits (depth 1) or copied (depth `bitsPerPixel`: 8, 16, 24 or 32). Rows are
/// padded to 4 bytes; each plane has at least Raster_CalculateCursorSize(width, height, depth)
/// bytes, and `dst` twice that of `bitsPerPixel`. `dst` must not overlap the planes.
RASTER_EXPORT RasterStatus RasterChecked_ExpandCursor(uint32 width, uint32 height, uint32 andDepth,
                                                      const uint8* andBits, size_t andBytes,
                                                      uint32 xorDepth, const uint8* xorBits,
                                                      size_t xorBytes, uint32 bitsPerPixel,
                                                      uint8* dst, size_t dstBytes);

/// Raster_ComputeCursorBox and Raster_DrawCursor: draws a cursor with its hot spot at (x, y),
/// clipped to `fb`. Every plane of the cursor has `planeBytes` bytes or more; a mask cursor has the
/// format of `fb`, one with alpha can be drawn where RasterChecked_Blend can.
///
/// With a view `save` (may be null) of the format of `fb`, the frame buffer is left alone: what is
/// visible of the cursor is drawn over a copy of its area at the top left of `save`, which must be
/// large enough and must not overlap `fb`. `box` (may be null) receives the visible part, all zero
/// where nothing is visible; nothing is drawn then.
RASTER_EXPORT RasterStatus RasterChecked_DrawCursor(const RasterView* fb, const RasterView* save,
                                                    const RasterCursor* cursor, size_t planeBytes,
                                                    int32 x, int32 y, RasterCursorBox* box);

/// The sizes of a scaled cursor, as Raster_GetScaledCursorSize gives them.
typedef struct RasterScaledCursor {
  uint32 paddedWidth;   ///< with the margins, in pixels
  uint32 paddedHeight;  ///< with the margins, in rows
  uint32 width;         ///< of the scaled planes, margins included
  uint32 height;        ///< in rows
  int32 hotX;           ///< of the hot spot, in pixels
  int32 hotY;           ///< its row
  uint32 planeBytes;    ///< of one scaled plane: width x 4 x height
} RasterScaledCursor;

/// Raster_GetScaledCursorSize for a cursor of `width` x `height` pixels with hot spot (hotX, hotY).
/// The factors are finite and above 1/32767; every size of the result is below 32768, otherwise the
/// status is TOO_BIG. `limits` hold for the scaled planes.
RASTER_EXPORT RasterStatus RasterChecked_ScaledCursorSize(uint32 width, uint32 height, int32 hotX,
                                                          int32 hotY, double scaleX, double scaleY,
                                                          const RasterLimits* limits,
                                                          RasterScaledCursor* scaled);

/// Raster_ScaleAlphaCursor and Raster_ScaleColorCursor, by the cursor's type: scales its planes,
/// which have 4-byte pixels and `planeBytes` bytes or more each, into `dst` of `dstBytes` bytes.
/// A cursor with alpha gives one plane of the size that RasterChecked_ScaledCursorSize tells, a
/// mask cursor the AND plane and the XOR plane right behind it. `dst` must not overlap the planes.
/// `scaled` (may be null) receives the sizes.
RASTER_EXPORT RasterStatus RasterChecked_ScaleCursor(const RasterCursor* cursor, size_t planeBytes,
                                                     double scaleX, double scaleY,
                                                     const RasterLimits* limits, uint8* dst,
                                                     size_t dstBytes, RasterScaledCursor* scaled);

// ---- Video -------------------------------------------------------------------------------------

/// The bytes of a frame as Raster_YUVtoRGB reads them: for "YUY2" and "UYVY" 4 x (width x height /
/// 2), for "YV12" the three planes. `format` is one of RASTER_VIDEO_...;
/// others are BAD_FORMAT.
RASTER_EXPORT RasterStatus RasterChecked_YuvBytes(uint32 format, uint32 width, uint32 height,
                                                  uint64* bytes);

/// Raster_YUVtoRGB: converts a frame of the size of `dst`, with at least RasterChecked_YuvBytes
/// bytes, into `dst`: 15/16, 16/16, 24/24 or 24/32, without gaps between rows. The frame must not
/// overlap it.
RASTER_EXPORT RasterStatus RasterChecked_YuvToRgb(const RasterView* dst, const uint8* frame,
                                                  size_t frameBytes, uint32 format);

// ---- Compressed blocks -------------------------------------------------------------------------

/// What the header of a block says.
typedef struct RasterBlockInfo {
  uint32 width;      ///< in pixels
  uint32 height;     ///< in rows
  uint32 pitch;      ///< bytes from one row to the next
  uint32 bpp;        ///< 8, 16, 24 or 32
  uint32 codeWords;  ///< 0 for a block that holds the pixels as they are
} RasterBlockInfo;

/// Reads the header of a block of Raster_Compress, without allocation. OK means that the header
/// describes rows that a view can have, keeps the limits and is followed by as many bytes as it
/// says; a code is not walked. DAMAGED for other headers, TRUNCATED for fewer bytes.
RASTER_EXPORT RasterStatus RasterChecked_BlockInfo(const uint8* block, size_t size,
                                                   const RasterLimits* limits,
                                                   RasterBlockInfo* info);

/// Raster_Decompress: unpacks a block into a new buffer of `pixels->bytes` = height x pitch bytes,
/// which the caller releases with free(pixels->data); the other fields describe it, with the depth
/// 8, 16 or 24. Blocks without a code, too, give their pixels. A code must make exactly the pixels
/// of the header: fewer or more are RASTER_STATUS_DAMAGED. Bytes after the block do not count.
RASTER_EXPORT RasterStatus RasterChecked_Decompress(const uint8* block, size_t size,
                                                    const RasterLimits* limits, RasterView* pixels);

/// Raster_Compress: packs a view of 8 to 32 bpp into a new block, which the caller releases with
/// free. `bytes` of the view must reach to the end of the last row's gap, since gaps are packed as
/// well. Blocks of 4 GiB and more are TOO_BIG.
RASTER_EXPORT RasterStatus RasterChecked_Compress(const RasterView* view, uint8** block,
                                                  size_t* size);

// ---- PNG ---------------------------------------------------------------------------------------

/// What the first chunk of a PNG picture says.
typedef struct RasterPngInfo {
  uint32 width;     ///< in pixels
  uint32 height;    ///< in rows
  uint8 bitDepth;   ///< bits per sample: 1, 2, 4, 8 or 16
  uint8 colorType;  ///< as in the file: 0 grey, 2 RGB, 3 palette, 4 grey and alpha, 6 RGB and alpha
  uint8 interlaced;  ///< 1 or 0
} RasterPngInfo;

/// The bytes at the start of a stream that RasterChecked_PngInfo reads.
enum { RASTER_CHECKED_PNG_INFO_BYTES = 33 };

/// Reads the header of a PNG stream without allocation: NOT_PNG, TRUNCATED (fewer than 33 bytes),
/// DAMAGED (a header that no picture has, or its checksum is wrong), or OK. No limits are applied.
RASTER_EXPORT RasterStatus RasterChecked_PngInfo(const uint8* png, size_t size,
                                                 RasterPngInfo* info);

/// In `flags` of the functions that read PNG. Other bits are refused.
enum {
  RASTER_CHECKED_KEEP_ALPHA = 1,   ///< pictures with alpha give 32 bpp, not 24 without the alpha
  RASTER_CHECKED_EXPAND_GREY = 2,  ///< grey pictures are read, as RGB
  RASTER_CHECKED_REDUCE_16 = 4     ///< 16-bit samples are read, their upper bytes
};

/// Decodes the PNG stream of `size` bytes, which may end anywhere, into a new image as
/// ImageUtil_ReadPNGBuffer does: palette pictures as 8 bpp, RGB as 24 bpp, with alpha as 32 bpp
/// where the flags say so, rows padded to 4 bytes with zeros. Grey pictures and 16-bit samples are
/// UNSUPPORTED unless the flags ask for them. Transparency other than an alpha channel is ignored,
/// and so are all chunks that do not make pixels. Bytes after the end of the picture do not count.
///
/// Memory held at any time is at most that of the pixels, four times the input and 1 MiB; it grows
/// with the rows that have been decoded, except for interlaced pictures, whose pixels are allocated
/// at once. Streams too short for the pixels that they promise are refused before that.
///
/// `message` (may be null) receives libpng's words about a stream that it refuses, cut to
/// `messageBytes` with the ending zero, or an empty text; also when the result is not OK.
RASTER_EXPORT RasterStatus RasterChecked_ReadPngBuffer(const uint8* png, size_t size, uint32 flags,
                                                       const RasterLimits* limits,
                                                       ImageUtilImage* image, char* message,
                                                       size_t messageBytes);

/// Reads a file as RasterChecked_ReadFile and decodes it as RasterChecked_ReadPngBuffer does.
RASTER_EXPORT RasterStatus RasterChecked_ReadPng(const char* path, uint32 flags,
                                                 const RasterLimits* limits, ImageUtilImage* image,
                                                 char* message, size_t messageBytes);

/// ImageUtil_ConstructPNGBuffer: encodes an image whose `data` holds `bytes` bytes as PNG, the same
/// bytes, into a new block that the caller releases with free. Images have 8 bpp and 1 to 256
/// colours, or 15/16, 16/16, 24/24 or 24/32. A null `params` stands for the defaults. Pixels beyond
/// the palette are BAD_ARGUMENT; pictures without pixels, too, and those with a side of more than
/// 1,000,000 are TOO_BIG.
RASTER_EXPORT RasterStatus RasterChecked_EncodePng(const ImageUtilImage* image, size_t bytes,
                                                   const ImageUtilPNGWriteParams* params,
                                                   uint8** file, size_t* fileBytes);

// ---- Images ------------------------------------------------------------------------------------

/// ImageUtil_ConstructBMPBuffer: encodes an image as a bitmap file into a new block that the caller
/// releases with free. Images as for RasterChecked_EncodePng, but of any size and also with no
/// colours. Files of 4 GiB and more are TOO_BIG. The padding of rows is zero where `bytes` or
/// `bytesPerLine` do not reach that far.
RASTER_EXPORT RasterStatus RasterChecked_EncodeBmp(const ImageUtilImage* image, size_t bytes,
                                                   uint8** file, size_t* fileBytes);

/// ImageUtil_Combine: lays `count` images out into a new one. `bytes[i]` is what the data of image
/// i holds; images without data count for the size. All have the format of the first; those of 8
/// bpp must neither overlap nor leave gaps. `limits` hold for the result. `*result` may be one of
/// `images`, and is overwritten, not released.
RASTER_EXPORT RasterStatus RasterChecked_Combine(const ImageUtilImage* images, const size_t* bytes,
                                                 const int32* positions, uint32 count,
                                                 const RasterLimits* limits,
                                                 ImageUtilImage* result);

/// ImageUtil_CropAndScaleImage: cuts [left, right) x [top, bottom) out of an image and scales it to
/// `newWidth` x `newHeight`; -1 for these four stands for the image's size and the crop's shape.
/// OUTSIDE for a crop that reaches out of the image, BAD_ARGUMENT for an empty crop and for a size
/// that is not positive or rounds to 0, BAD_FORMAT where pixels cannot be scaled. Unlike there, the
/// padding of the rows is always zero. `limits` hold for the result, which is overwritten, not
/// released.
RASTER_EXPORT RasterStatus RasterChecked_CropAndScale(const ImageUtilImage* image, size_t bytes,
                                                      int32 left, int32 top, int32 right,
                                                      int32 bottom, int32 newWidth, int32 newHeight,
                                                      const RasterLimits* limits,
                                                      ImageUtilImage* result);

// ---- Files -------------------------------------------------------------------------------------

/// In `flags` of the functions that write files. Other bits are refused.
enum {
  RASTER_CHECKED_SYNC = 1,       ///< the file and its folder are on the device when the call ends
  RASTER_CHECKED_NO_REPLACE = 2  ///< a file that is there is left alone: RASTER_STATUS_EXISTS
};

/// Reads a plain file into a new block that the caller releases with free (also for no bytes).
/// LIMIT for more than `limits->inputBytes`, NOT_REGULAR for anything but a plain file; a pipe
/// without a writer is not waited for.
RASTER_EXPORT RasterStatus RasterChecked_ReadFile(const char* path, const RasterLimits* limits,
                                                  uint8** bytes, size_t* size);

/// Writes a file, all or nothing: a new one of mode 0666 less the umask, or in place of one that is
/// there, whose mode is kept. Readers see the old or the new bytes, never some of both. Links are
/// followed. On failure the file is as it was, and nothing else is left in its folder. Anything but
/// a plain file is not replaced (NOT_REGULAR).
RASTER_EXPORT RasterStatus RasterChecked_WriteFile(const char* path, const uint8* bytes,
                                                   size_t size, uint32 flags);

/// ImageUtil_WriteImage and ImageUtil_WritePNG: encodes an image as RasterChecked_EncodePng (with
/// `params`, may be null) or RasterChecked_EncodeBmp does, by the IMAGE_UTIL_TYPE_..., and writes
/// it as RasterChecked_WriteFile does.
RASTER_EXPORT RasterStatus RasterChecked_WriteImage(const ImageUtilImage* image, size_t bytes,
                                                    const char* path, uint32 imageType,
                                                    const ImageUtilPNGWriteParams* params,
                                                    uint32 flags);

/// @}

// NOLINTEND(modernize-use-using)

#ifdef __cplusplus
}
#endif

#endif
