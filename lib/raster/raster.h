// SPDX-License-Identifier: MIT
/// \file
/// Raster graphics on frame buffers that the caller owns: fill, copy, raster operations, tiling,
/// bit planes, format conversion, comparison, blending, scaling, cursors, video and compression.
///
/// Conventions that hold for every function unless it says otherwise:
/// - A frame buffer is a base pointer to byte 0 of row 0, a pitch (bytes from one row to the next),
///   and a pixel size or format. Pixel (x, y) starts at base + y * pitch + x * bytes per pixel.
///   Base and pitch may have any alignment. Nothing outside the named rectangle is read or written.
/// - No pointer may be null unless its function says so, but for the pixels of empty rectangles.
/// - Memory that is read and memory that is written must not overlap unless the function says what
///   happens then.
/// - Coordinates and sizes are in pixels, 32-bit. The caller clips; nothing checks bounds.
/// - A pixel value is an unsigned 32-bit word stored as its low 1, 2, 3 or 4 bytes, lowest byte at
///   the lowest address.
/// - Fatal errors go through Warning and Panic (message.h); Panic does not return.
/// - Memory: only scaling (Raster_Scale, Raster_ScaleAlphaCursor, Raster_ScaleColorCursor),
///   Raster_Compress and Raster_Decompress allocate, with UtilSafeMalloc0, which ends the process
///   when there is none.
/// - No function keeps state (but for flags of messages that are logged once) or takes a lock;
///   calls on disjoint memory may run on several threads.

#ifndef RASTER_RASTER_H
#define RASTER_RASTER_H

#include "baseTypes.h"
#include "rasterExport.h"
#include "rasterVersion.h"
#include "rect.h"

#ifdef __cplusplus
extern "C" {
#endif

// ---- Fill and copy -----------------------------------------------------------------------------

/// \defgroup raster_fill Fill and copy
/// @{

/// A switch for Raster_RectCopy, 0 when the library is loaded. The host may set it to non-zero,
/// before its first copy, on processors with MMX and the non-temporal 64-bit store: copies of at
/// least 32 bytes by 16 rows then bypass the cache. The pixels are the same either way. The library
/// never writes it.
extern RASTER_EXPORT uint32 rasterops_mmx;

/// Stores `pixel` in every pixel of a rectangle.
///
/// `pitch` is in bytes; `bytesPerPixel` is 1, 2, 3 or 4. Any other size calls
/// Warning("Raster: Unsupported frame buffer depth\n") and then
/// Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterops". A width or height of 0 writes
/// nothing.
///
/// Deliberate: for 2- and 4-byte pixels the first row is found with the full pitch, and rows after
/// it step by the pitch rounded down to a multiple of the pixel size.
RASTER_EXPORT void Raster_RectFill(uint8* fb, uint32 pitch, uint32 bytesPerPixel, uint32 pixel,
                                   uint32 x, uint32 y, uint32 width, uint32 height);

/// Copies a rectangle within a frame buffer or between two with the same pixel size.
///
/// The rectangles may overlap when `dst` and `src` are the same frame buffer: rows run from the
/// last one up when dstY > srcY and from the first one down otherwise, and a row whose start lies
/// within the other's is moved as by memmove. `bytesPerPixel` may have any value, since bytes are
/// copied. With rasterops_mmx set, rows that do not overlap bypass the cache when the rectangle has
/// at least 32 bytes a row and 16 rows.
RASTER_EXPORT void Raster_RectCopy(uint8* dst, uint32 dstPitch, const uint8* src, uint32 srcPitch,
                                   uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 dstX,
                                   uint32 dstY, uint32 width, uint32 height);

/// Sets bits 24-31 of every pixel of a rectangle of 4-byte pixels to `alpha`; bits 0-23 stay.
/// Rows step by the full pitch.
RASTER_EXPORT void Raster_RectFillAlpha(uint8* fb, uint32 pitch, uint8 alpha, uint32 x, uint32 y,
                                        uint32 width, uint32 height);

/// @}

// ---- Raster operations -------------------------------------------------------------------------

/// \defgroup raster_rops Raster operations
///
/// An operation code is a number from 0 to 15, as in the graphics contexts of the X Window System
/// protocol. With S the source and D the destination pixel, D becomes:
///
///     0 clear         0             8 nor           NOT (S OR D)
///     1 and           S AND D       9 equiv         NOT (S XOR D)
///     2 andReverse    S AND NOT D  10 invert        NOT D
///     3 copy          S            11 orReverse     S OR NOT D
///     4 andInverted   NOT S AND D  12 copyInverted  NOT S
///     5 noop          D            13 orInverted    NOT S OR D
///     6 xor           S XOR D      14 nand          NOT (S AND D)
///     7 or            S OR D       15 set           all bits set
///
/// All bits of a pixel take part, the top byte of a 4-byte pixel included. A code above 15 is not
/// an error: nothing is written, as for noop. Operations that do not depend on the source do not
/// read it, and those that do not depend on the destination do not read that.
/// @{

/// The operation codes by name, for parameters called `rop`.
enum {
  RASTER_ROP_CLEAR = 0,
  RASTER_ROP_AND = 1,
  RASTER_ROP_AND_REVERSE = 2,
  RASTER_ROP_COPY = 3,
  RASTER_ROP_AND_INVERTED = 4,
  RASTER_ROP_NOOP = 5,
  RASTER_ROP_XOR = 6,
  RASTER_ROP_OR = 7,
  RASTER_ROP_NOR = 8,
  RASTER_ROP_EQUIV = 9,
  RASTER_ROP_INVERT = 10,
  RASTER_ROP_OR_REVERSE = 11,
  RASTER_ROP_COPY_INVERTED = 12,
  RASTER_ROP_OR_INVERTED = 13,
  RASTER_ROP_NAND = 14,
  RASTER_ROP_SET = 15,
  RASTER_ROP_COUNT = 16
};

/// Combines `pixel` with every pixel of a rectangle through operation `rop` (\ref raster_rops).
///
/// `pitch` is in bytes and may be negative; `bytesPerPixel` is 1, 2, 3 or 4, and the low bytes of
/// `pixel` are used. Any other size calls Warning("Raster: Unsupported frame buffer depth\n") and
/// then Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterops", whatever `rop` is. A width or
/// height of 0 writes nothing. Operation 3 is Raster_RectFill.
///
/// Deliberate: for 2- and 4-byte pixels the first row is found with the full pitch, and rows after
/// it step by the pitch rounded down (toward minus infinity) to a multiple of the pixel size.
RASTER_EXPORT void Raster_RectROPfill(uint8* fb, int32 pitch, uint32 bytesPerPixel, uint32 pixel,
                                      uint32 rop, uint32 x, uint32 y, uint32 width, uint32 height);

/// Combines a source rectangle with a destination rectangle of the same size through operation
/// `rop` (\ref raster_rops), within a frame buffer or between two with the same pixel size.
///
/// Pitches are in bytes and may be negative. The rectangles may overlap: rows run from the last one
/// up when srcY < dstY and from the first one down otherwise; pixels run from right to left when
/// srcY == dstY and dstX > srcX and from left to right otherwise. So every source pixel is read
/// before it is overwritten when `dst` and `src` are the same frame buffer. The order depends on
/// the coordinates only. Where the same memory is reached in other ways, the result is that of
/// reading, combining and storing one pixel after the other in this order; pixels of 3 bytes are
/// three operations on bytes, in rising address order, or from right to left in falling order.
///
/// Operation 3 is Raster_RectCopy, for any `bytesPerPixel`. With the other ones a size other than
/// 1, 2, 3 or 4 calls Warning("Raster: Unsupported frame buffer depth\n") and then
/// Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterops", before `rop` is looked at. A width
/// or height of 0 writes nothing.
///
/// Deliberate: `rop` stands between the coordinates. For 2- and 4-byte pixels the first row is
/// found with the full pitch, and rows after it step by the pitch, negated where rows run up, and
/// then rounded down (toward minus infinity) to a multiple of the pixel size.
RASTER_EXPORT void Raster_RectROPcopy(uint8* dst, int32 dstPitch, const uint8* src, int32 srcPitch,
                                      uint32 bytesPerPixel, uint32 srcX, uint32 srcY, uint32 rop,
                                      uint32 dstX, uint32 dstY, uint32 width, uint32 height);

/// @}

// ---- Tiling ------------------------------------------------------------------------------------

/// \defgroup raster_tiling Tiling
///
/// A pixmap is a picture with the pixel size of the destination, laid out endlessly to the right
/// and downwards. Its pixel (tileX mod pixmapWidth, tileY mod pixmapHeight) falls on (dstX, dstY).
/// The rectangle is cut into blocks at the pixmap's edges: bands of rows from the top down, each
/// cut into blocks from left to right. Within a block, pixels run top down and from left to right,
/// also where pixmap and rectangle overlap.
///
/// Deliberate: for 2- and 4-byte pixels the first row of a block is found with the full pitches,
/// and rows after it step by the pitches rounded down to a multiple of the pixel size.
/// @{

/// Fills a rectangle with a repeated pixmap, as Raster_RectPixmapROPcopy with operation 3.
/// \ref raster_tiling says how a pixmap is laid out, which pitches count and what overlap gives.
RASTER_EXPORT void Raster_RectPixmapCopy(uint8* dst, uint32 dstPitch, const uint8* pixmap,
                                         uint32 pixmapPitch, int32 bytesPerPixel, uint32 tileX,
                                         uint32 tileY, uint32 pixmapWidth, uint32 pixmapHeight,
                                         uint32 dstX, uint32 dstY, uint32 width, uint32 height);

/// Combines a repeated pixmap with a rectangle through operation `rop` (0 to 15, see above; higher
/// ones write nothing).
///
/// Pitches are in bytes; the pixmap's size is in pixels and must not be 0: a size of 0 divides by
/// zero, before anything else is looked at. A `bytesPerPixel` other than 1, 2, 3 or 4 calls
/// Warning("Raster: Unsupported frame buffer depth\n") and then Panic("NOT_IMPLEMENTED %s:%d\n")
/// with "lib/raster/rasterpix". A width or height of 0 writes nothing.
/// \ref raster_tiling says how a pixmap is laid out, which pitches count and what overlap gives.
RASTER_EXPORT void Raster_RectPixmapROPcopy(uint8* dst, uint32 dstPitch, const uint8* pixmap,
                                            uint32 pixmapPitch, int32 bytesPerPixel, uint32 tileX,
                                            uint32 tileY, uint32 pixmapWidth, uint32 pixmapHeight,
                                            uint32 rop, uint32 dstX, uint32 dstY, uint32 width,
                                            uint32 height);

/// @{
/// The blocks of Raster_RectPixmapROPcopy by pixel size (8, 16, 24, 32 bits): combine the rectangle
/// at (srcX, srcY) of `src` into that at (dstX, dstY) of `dst`, without wrapping, top down and from
/// left to right (\ref raster_tiling has the steps). Nothing looks for overlap: where `src` lies in
/// what is written already, the new pixels count. Operation 3 is such a walk, not Raster_RectCopy.
RASTER_EXPORT void RasterRectPixmapROPcopy8(uint8* dst, uint32 dstPitch, const uint8* src,
                                            uint32 srcPitch, uint32 srcX, uint32 srcY, uint32 rop,
                                            uint32 dstX, uint32 dstY, uint32 width, uint32 height);
RASTER_EXPORT void RasterRectPixmapROPcopy16(uint8* dst, uint32 dstPitch, const uint8* src,
                                             uint32 srcPitch, uint32 srcX, uint32 srcY, uint32 rop,
                                             uint32 dstX, uint32 dstY, uint32 width, uint32 height);
RASTER_EXPORT void RasterRectPixmapROPcopy24(uint8* dst, uint32 dstPitch, const uint8* src,
                                             uint32 srcPitch, uint32 srcX, uint32 srcY, uint32 rop,
                                             uint32 dstX, uint32 dstY, uint32 width, uint32 height);
RASTER_EXPORT void RasterRectPixmapROPcopy32(uint8* dst, uint32 dstPitch, const uint8* src,
                                             uint32 srcPitch, uint32 srcX, uint32 srcY, uint32 rop,
                                             uint32 dstX, uint32 dstY, uint32 width, uint32 height);
/// @}
/// @}

// ---- Bit planes --------------------------------------------------------------------------------

/// \defgroup raster_bits Bit planes
///
/// A bit plane has one bit a pixel, the most significant bit of a byte first, and starts each row
/// with a whole byte: pixel i of a row is bit 7 - i mod 8 of byte i / 8. Bits beyond the width are
/// ignored, and no byte beyond the last one needed is read. `dst` is the address of the rectangle's
/// first pixel; pitches are in bytes. A width or height that is not positive writes nothing.
///
/// A plane that lies in the rectangle is looked at once for every four pixels, just before these
/// are written; rows run top down and pixels from left to right.
///
/// Deliberate: rows step by the full pitch for every pixel size, so that pixels of 2 and 4 bytes
/// may lie at any address; and a `bytesPerPixel` other than 1, 2, 3 or 4 does nothing, without a
/// warning.
/// @{

/// Writes `foreground` where a bit of the plane is set and `background` where it is clear.
/// \ref raster_bits says how a plane lies in memory, which sizes do nothing and what overlap gives.
RASTER_EXPORT void Raster_BitsToPixels(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                       uint32 dstPitch, int32 bytesPerPixel, int32 width,
                                       int32 height, uint32 foreground, uint32 background);

/// Writes `foreground` where a bit of the plane is set; pixels of clear bits stay.
/// \ref raster_bits says how a plane lies in memory, which sizes do nothing and what overlap gives.
///
/// With AVX-512 (level avx3) and in portable code (scalar) pixels of clear bits are neither read
/// nor written. The levels between leave out groups of clear bits, counted from the start of a row:
///
/// | bytes per pixel | 1          | 2         | 3 and 4   |
/// |-----------------|------------|-----------|-----------|
/// | ssse3, sse4     | 64 pixels  | 32 pixels | 16 pixels |
/// | avx2            | 128 pixels | 64 pixels | 32 pixels |
///
/// and in what is left of the row smaller groups, then single pixels. In a group with set and clear
/// bits all pixels are read and the clear ones written back with their value: no other thread may
/// store there during the call.
RASTER_EXPORT void Raster_BitsToPixelsStencil(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                              uint32 dstPitch, int32 bytesPerPixel, int32 width,
                                              int32 height, uint32 foreground);

/// Raster_BitsToPixels for one pixel size (8, 16, 24, 32 bits), of which the low bits of the values
/// are used; \ref raster_bits holds for all of these.
RASTER_EXPORT void RasterBitsToPixels8(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                       uint32 dstPitch, int32 width, int32 height,
                                       uint32 foreground, uint32 background);
RASTER_EXPORT void RasterBitsToPixels16(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                        uint32 dstPitch, int32 width, int32 height,
                                        uint32 foreground, uint32 background);  ///< for 16 bits
RASTER_EXPORT void RasterBitsToPixels24(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                        uint32 dstPitch, int32 width, int32 height,
                                        uint32 foreground, uint32 background);  ///< for 24 bits
RASTER_EXPORT void RasterBitsToPixels32(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                        uint32 dstPitch, int32 width, int32 height,
                                        uint32 foreground, uint32 background);  ///< for 32 bits

/// Raster_BitsToPixelsStencil for one pixel size (8, 16, 24, 32 bits).
RASTER_EXPORT void RasterBitsToPixelsStencil8(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                              uint32 dstPitch, int32 width, int32 height,
                                              uint32 foreground);
RASTER_EXPORT void RasterBitsToPixelsStencil16(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                               uint32 dstPitch, int32 width, int32 height,
                                               uint32 foreground);  ///< for 16 bits
RASTER_EXPORT void RasterBitsToPixelsStencil24(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                               uint32 dstPitch, int32 width, int32 height,
                                               uint32 foreground);  ///< for 24 bits
RASTER_EXPORT void RasterBitsToPixelsStencil32(const uint8* bits, uint32 bitsPitch, uint8* dst,
                                               uint32 dstPitch, int32 width, int32 height,
                                               uint32 foreground);  ///< for 32 bits

/// @}

// ---- Pixel formats and conversion --------------------------------------------------------------

/// \defgroup raster_formats Pixel formats and conversion
///
/// A pixel format is named by one code, the "bppdepth": the colour depth, but 32 for depth 24
/// stored in 32 bits (Raster_GetBPPDepth).
///
///     code  bytes  layout of the value
///     3     1      eight colours: red in bit 2, green in bit 5, blue in bit 7, other bits 0
///     6     1      red in bits 5-4, green in bits 3-2, blue in bits 1-0
///     8     1      red in bits 2-0, green in bits 5-3, blue in bits 7-6 (or an index, see below)
///     15    2      red in bits 14-10, green in bits 9-5, blue in bits 4-0, bit 15 unused
///     16    2      red in bits 15-11, green in bits 10-5, blue in bits 4-0
///     24    3      blue, green, red at increasing addresses: 0x00RRGGBB
///     32    4      0xAARRGGBB; alpha, or unused
///
/// A pseudo-colour source holds indices into a palette, an array of 0x00RRGGBB that the caller
/// owns; its length is not checked. No conversion searches a palette: a destination of code 8 is
/// always true colour. Narrowing a channel keeps its top bits, without rounding or dithering;
/// widening repeats the top bits in the new low ones.
/// @{

/// The format codes by name: the bits of red, green and blue, from the top.
enum {
  RASTER_FORMAT_111 = 3,
  RASTER_FORMAT_222 = 6,
  RASTER_FORMAT_233 = 8,  ///< blue is on top here
  RASTER_FORMAT_555 = 15,
  RASTER_FORMAT_565 = 16,
  RASTER_FORMAT_888 = 24,
  RASTER_FORMAT_8888 = 32
};

/// Whether a frame buffer of this colour depth and these bits per pixel is one that the library can
/// work with: pseudo-colour with 8 bits (the depth is not looked at), depth 24 with 24 or 32 bits,
/// depth 15 or 16 with 16 bits.
///
/// Deliberate: depth 32 is refused; pixels with an unused byte have depth 24.
RASTER_EXPORT bool Raster_IsModeReasonable(uint32 depth, uint32 bpp, bool pseudoColor);

/// The format code of a depth and a pixel size: 32 for depth 24 in 32 bits, else the depth itself,
/// whatever it is.
RASTER_EXPORT uint32 Raster_GetBPPDepth(uint32 depth, uint32 bpp);

/// Converts one pixel value between the formats of \ref raster_formats. `srcDepth` (15, 16, 24, 32)
/// and `dstDepth` (3, 6, 8, 15, 16, 24, 32) are format codes; 24 and 32 mean the same value here.
/// With `pseudoColor`, `srcDepth` must be 8 and `pixel`, all 32 bits of it, is an index into
/// `palette`, which is read in no other case.
///
/// Bits 31-24 are those of the source from 24 or 32 to 24 or 32, and 0 otherwise.
///
/// Deliberate: a value that has the format of the destination already comes back whole, unused bits
/// included. To code 6 other bits are taken than the top ones of each channel: the bits that the
/// shifts of code 8 bring under its masks. From 24 or 32 that is bits 26-25 for red, 13-12 for
/// green, 1-0 for blue. Raster_ConvertPixels does take the top bits.
///
/// A wrong code calls Warning with one of these texts and the code, and then
/// Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterConv"; the source is checked first:
/// - "Raster convert pixels invalid depth for pseudo color %d\n" (srcDepth)
/// - "Raster convert one pixel invalid source depth %d\n" (srcDepth)
/// - "Raster convert one pixel invalid depth %d\n" (dstDepth)
RASTER_EXPORT uint32 Raster_ConvertOnePixel(uint32 pixel, int32 srcDepth, int32 dstDepth,
                                            bool pseudoColor, const uint32* palette);

/// Converts a rectangle of pixels from one frame buffer into another, which must not overlap it:
/// what is stored then, in place too, differs between instruction-set levels.
///
/// `srcDepth` (15, 16, 24, 32) and `dstDepth` (3, 6, 8, 15, 16, 24, 32) are format codes. With
/// `pseudoColor` the source has one byte a pixel, an index into `palette`, and any depth up to 8.
/// Pixels of code 32 made from true colour have 0xFF in bits 31-24; palette entries are stored
/// there as they are. A width or height of 0 writes nothing.
///
/// Without `pseudoColor`, equal codes are copied by Raster_CopyPixels, with no check of the code.
///
/// Pitches are in bytes.
/// Deliberate: pixels of 2 and 4 bytes are counted in whole pixels, so the pitch of such a side is
/// rounded down to a multiple of the pixel size, for the first row too (a copy takes it in full).
///
/// A wrong code calls Warning with one of these texts and the code, and then
/// Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterConv", whatever the size:
/// - "Raster convert pixels invalid depth for pseudo color %d\n" (srcDepth)
/// - "Raster convert pixels invalid source depth %d\n" (srcDepth)
/// - "Raster convert pixels invalid depth %d\n" (dstDepth, after srcDepth)
RASTER_EXPORT void Raster_ConvertPixels(void* dst, uint32 dstPitch, int32 dstDepth, const void* src,
                                        uint32 srcPitch, int32 srcDepth, bool pseudoColor,
                                        const uint32* palette, uint32 srcX, uint32 srcY,
                                        uint32 dstX, uint32 dstY, uint32 width, uint32 height);

/// Raster_ConvertPixels with destination code 32.
RASTER_EXPORT void Raster_ConvertPixelsTo32(uint32* dst, uint32 dstPitch, const void* src,
                                            uint32 srcPitch, int32 srcDepth, bool pseudoColor,
                                            const uint32* palette, uint32 srcX, uint32 srcY,
                                            uint32 dstX, uint32 dstY, uint32 width, uint32 height);

/// Raster_ConvertPixels with source code 32 and no palette.
RASTER_EXPORT void Raster_ConvertPixelsFrom32(void* dst, uint32 dstPitch, int32 dstDepth,
                                              const uint32* src, uint32 srcPitch, uint32 srcX,
                                              uint32 srcY, uint32 dstX, uint32 dstY, uint32 width,
                                              uint32 height);

/// Copies a rectangle of pixels into another frame buffer, which must not overlap it.
///
/// A pixel has 2 bytes for depth 15, 1 for depths 3 and 6, and otherwise depth / 8, rounded down.
/// Rows step by the full pitch.
///
/// Deliberate: the depth is not checked; one below 8 that is no format copies nothing.
RASTER_EXPORT void Raster_CopyPixels(void* dst, uint32 dstPitch, const void* src, uint32 srcPitch,
                                     int32 depth, uint32 srcX, uint32 srcY, uint32 dstX,
                                     uint32 dstY, uint32 width, uint32 height);

/// @}

// ---- Rect lists --------------------------------------------------------------------------------

/// \defgroup raster_lists Rect lists
///
/// A sweep over the scanlines where rectangles begin or end rebuilds the whole list: a rectangle of
/// the result goes on downwards exactly as long as the region has the same horizontal extent there,
/// touching rectangles are joined, and rectangles are listed by top, then by x. The result has at
/// most 15 rectangles and fills the rest of the list with zeros. Any list is accepted, not only one
/// that came from here; the sums x + width and y + height must fit 32 bits, which is not checked. A
/// list must not be used by two threads at once.
/// @{

/// One rectangle of a list, by origin and size.
typedef struct RectListEntry {
  int32 x;       ///< the left edge, in pixels
  int32 y;       ///< the top edge
  int32 width;   ///< in pixels; not positive ends the list
  int32 height;  ///< in pixels
} RectListEntry;

enum { RASTER_RECT_LIST_SIZE = 16 };

/// A region as disjoint rectangles; it ends at the first entry whose width is not positive.
typedef struct RectList {
  RectListEntry rects[RASTER_RECT_LIST_SIZE];  ///< by top, then by x
} RectList;

/// Sets all 16 entries to zero.
RASTER_EXPORT void Raster_ClearRectList(RectList* list);

/// Adds a rectangle to the region and returns the area of the whole in pixels (modulo 2^32, as all
/// areas here). \ref raster_lists says how the region is cut into rectangles, what must fit 32
/// bits, and that a list is for one thread at a time. When that takes more than 15 rectangles, the
/// region becomes its bounding box.
///
/// A width or height of 0 (tested first) changes nothing and returns 0; a negative one ends in
/// Panic("ASSERT %s:%d bugNr=%d\n") with "lib/raster/rasterRect" and 15740. When the first entry is
/// empty by width or by height, the rectangle is stored there, its area is returned, and no other
/// entry is touched.
///
/// Deliberate: the rectangle is first stored in the entry that ends the list. Old entries behind it
/// come to life by that, but their tops and bottoms do not count as scanlines of the sweep.
/// Deliberate: when all 16 entries are in use, the new rectangle is dropped and the list only
/// rebuilt.
RASTER_EXPORT uint32 Raster_AddRect(RectList* list, int32 x, int32 y, int32 width, int32 height);

/// Takes a rectangle out of the region and returns the area that is left, cut into rectangles as
/// \ref raster_lists says. A width or height of 0, or a list whose first entry is empty by width or
/// by height, changes nothing and returns 0.
/// When more than 15 rectangles would be left, or when a scanline of 16 spans would have to be
/// split, the call ends in Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterRect".
///
/// Deliberate: negative sizes are not rejected. A negative height takes out nothing; with a
/// negative width a span that holds both x + width and x is left as two spans that overlap.
/// Deliberate: when all 16 entries are in use, the tops and bottoms of the list alone are scanlines
/// of the sweep, and the subtraction takes effect from one to the next of these.
RASTER_EXPORT uint32 Raster_SubRect(RectList* list, int32 x, int32 y, int32 width, int32 height);

/// @}

// ---- Comparison --------------------------------------------------------------------------------

/// \defgroup raster_comparison Comparison
///
/// In 4-byte pixels the fourth byte never counts. A broken precondition ends in
/// Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterComp", without a warning. Positions and
/// sizes are not checked against the buffers. Memory is only read; pitches are in bytes.
/// @{

/// Compares the rectangle at (aX, aY) of `a` with the one at (bX, bY) of `b`, row by row from the
/// top: 0 when they are equal, otherwise a number with memcmp's sign for the first byte that
/// differs. Both bits per pixel must be the same multiple of 8, whatever the size of the rectangle.
/// \ref raster_comparison says what a broken precondition does and which bytes never count. The
/// memory may overlap.
RASTER_EXPORT int32 Raster_ComparePixels(const void* a, uint32 aPitch, int32 aBpp, const void* b,
                                         uint32 bPitch, int32 bBpp, uint32 aX, uint32 aY, uint32 bX,
                                         uint32 bY, uint32 width, uint32 height);

/// Compares every rectangle of a list at the same position in both buffers: 0, or the first result
/// of Raster_ComparePixels that is not 0, with its conditions (\ref raster_comparison). The bits
/// per pixel are not looked at when the list is empty.
///
/// Deliberate: the walk ends at the first entry whose height or width is not positive and nowhere
/// else, so after a full list there must be such an entry in memory.
RASTER_EXPORT int32 Raster_CompareRects(const void* a, uint32 aPitch, int32 aBpp, const void* b,
                                        uint32 bPitch, int32 bBpp, const RectList* rects);

/// Whether two whole images agree under a mask, but for `maxDiffs` pixels' worth of bytes.
///
/// The mask has a byte for every byte of an image. With pixels of one byte a mask byte that is not
/// 0 makes the byte count; with larger ones the mask's bits say which bits count. All three bits
/// per pixel must be equal, all three pitches too, `x` and `y` must be 0, and the pitch must be
/// `width` times the bytes per pixel (bits per pixel / 8, rounded up): rows follow each other
/// without a gap. These are checked in this order; \ref raster_comparison says what a broken one
/// does. An image without bytes agrees. The memory may overlap.
///
/// Deliberate: differing bytes are counted, not pixels, against `maxDiffs` times the bytes per
/// pixel; in 4-byte pixels (25 to 32 bits) the fourth byte is not counted but stands in the limit.
RASTER_EXPORT bool Raster_CompareMasked(const uint8* a, uint32 aPitch, int32 aBpp, const uint8* b,
                                        uint32 bPitch, int32 bBpp, const uint8* mask,
                                        uint32 maskPitch, int32 maskBpp, int32 x, int32 y,
                                        uint32 width, uint32 height, int32 maxDiffs);

/// @}

// ---- Alpha blending ----------------------------------------------------------------------------

/// \defgroup raster_blending Alpha blending
/// @{

/// The operators of Raster_AlphaBlend by name, for its parameter `op`.
enum {
  RASTER_BLEND_CLEAR = 0,
  RASTER_BLEND_SOURCE = 1,
  RASTER_BLEND_DESTINATION = 2,
  RASTER_BLEND_OVER = 3,
  RASTER_BLEND_OVER_REVERSE = 4,
  RASTER_BLEND_IN = 5,
  RASTER_BLEND_IN_REVERSE = 6,
  RASTER_BLEND_OUT = 7,
  RASTER_BLEND_OUT_REVERSE = 8,
  RASTER_BLEND_ATOP = 9,
  RASTER_BLEND_ATOP_REVERSE = 10,
  RASTER_BLEND_XOR = 11,
  RASTER_BLEND_ADD = 12,
  RASTER_BLEND_SATURATE = 13,
  RASTER_BLEND_COUNT = 14
};

/// The bits of its parameter `flags`.
enum {
  RASTER_BLEND_USE_SRC_ALPHA = 1,  ///< scale the source by `srcAlpha`
  RASTER_BLEND_USE_DST_ALPHA = 2   ///< scale the destination by `dstAlpha`, which is its alpha then
};

/// Composites a rectangle of 4-byte source pixels with alpha onto a frame buffer without.
///
/// Source pixels are channel 0, channel 1, channel 2 and alpha in memory order, the channels
/// premultiplied by alpha. Pitches are in bytes, and rows step by the full pitch. The formats of
/// the destination, in bits from the lowest:
///
/// | depth | bpp | pixel    | channel 0 | channel 1 | channel 2 | other bits          |
/// |-------|-----|----------|-----------|-----------|-----------|---------------------|
/// | 6     | any | 1 byte   | 0-1       | 2-3       | 4-5       | 6-7 become 0        |
/// | 8     | any | 1 byte   | 6-7       | 3-5       | 0-2       |                     |
/// | 15    | any | 2 bytes  | 0-4       | 5-9       | 10-14     | 15 becomes 0        |
/// | 16    | any | 2 bytes  | 0-4       | 5-10      | 11-15     |                     |
/// | 24    | 24  | 3 bytes  | byte 0    | byte 1    | byte 2    |                     |
/// | 24    | 32  | 4 bytes  | byte 0    | byte 1    | byte 2    | byte 3 keeps its value |
///
/// Any other pair ends in Panic("ASSERT %s:%d bugNr=%d\n", "lib/raster/alphaBlend", 205, 19864),
/// also for an empty rectangle. Fields are widened to 8 bits by repeating them from the top, and
/// narrowed to their top bits.
///
/// `op` is one of the numbers of the X Rendering Extension's operators (Porter and Duff 1984), 0 to
/// 13; larger ones are not checked for. With s and d a channel of source and destination, sa and da
/// their alphas, every product divided by 255 toward zero and every sum clamped at 255:
///
/// | op | name         | result                    | op | name            | result              |
/// |----|--------------|---------------------------|----|-----------------|---------------------|
/// | 0  | Clear        | 0                         | 7  | Out             | s(255-da)           |
/// | 1  | Source       | s                         | 8  | Out-reverse     | d(255-sa)           |
/// | 2  | Destination  | d                         | 9  | Atop            | s da + d(255-sa)    |
/// | 3  | Over         | s + d(255-sa)             | 10 | Atop-reverse    | d sa + s(255-da)    |
/// | 4  | Over-reverse | d + s(255-da)             | 11 | Xor             | as 10               |
/// | 5  | In           | s da                      | 12 | Add             | s + d               |
/// | 6  | In-reverse   | d sa                      | 13 | Saturate        | d + s F             |
///
/// F is (255 - da) / da, truncated and at most 255. Bit 0 of `flags` first scales all four source
/// bytes by `srcAlpha` / 255. Bit 1 scales the destination's channels by `dstAlpha` / 255 and makes
/// da = dstAlpha; without it da is 255. Other bits are ignored; both alphas are 0 to 255.
///
/// `staged` 0 blends in place, from left to right and row after row, so that source and destination
/// may overlap. Any other value moves the destination through a buffer: the frame buffer, be it
/// slow or shared, is then touched by blocks of at most 3072 bytes only, each read once and in
/// order before it is copied back, and a source that overlaps it is read as it was before. The
/// pixels are otherwise equal.
///
/// Operators 0 and 2 read no source, and in place 0, 1, 5 and 7 no destination.
///
/// Byte 3 of 4-byte pixels is not written with AVX-512 (level avx3), though it may be read with the
/// others, and neither read nor written in place by the portable code (scalar). The levels between,
/// ssse3, sse4 and avx2, have no masks for bytes: within a row they read it and write it back with
/// its value, whatever the operator, and so does the staged variant of the portable code. No other
/// thread may store there during the call. Byte 3 of a row's last pixel is left out at every level,
/// so that a buffer may end before it; where neither buffer has gaps between its rows, all rows
/// count as one.
///
/// Deliberate:
/// - Operator 11 is computed as operator 10.
/// - A field of three bits (depth 8) widens to c << 5 | c << 2 | (c & 3), so 4 becomes 0x90. There
///   channel 0 is in the top bits, in all other depths in the lowest.
/// - Operator 13 with bit 1 of `flags` and `dstAlpha` 0 divides by zero: where there is a pixel to
///   blend the call raises SIGFPE, and traps should a handler return.
RASTER_EXPORT void Raster_AlphaBlend(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch,
                                     const uint8* src, uint32 srcX, uint32 srcY, uint32 srcPitch,
                                     uint32 width, uint32 height, uint32 depth, uint32 bpp,
                                     uint32 op, uint32 flags, uint32 srcAlpha, uint32 dstAlpha,
                                     uint8 staged);

/// Raster_AlphaBlend with operator 3 (Over) and without constant alphas.
RASTER_EXPORT void Raster_AlphaBlendOver(uint8* dst, uint32 dstX, uint32 dstY, uint32 dstPitch,
                                         const uint8* src, uint32 srcX, uint32 srcY,
                                         uint32 srcPitch, uint32 width, uint32 height, uint32 depth,
                                         uint32 bpp, uint8 staged);

/// @}

// ---- Scaling -----------------------------------------------------------------------------------

/// \defgroup raster_scaling Scaling
/// @{

/// Always true. Nothing needs to be set up before Raster_Scale.
RASTER_EXPORT bool Raster_ScaleInit(void);

/// Does nothing.
RASTER_EXPORT void Raster_ScaleExit(void);

/// Draws a rectangle of a scaled picture: the destination rectangle (x1, y1)-(x2, y2), x2 and y2
/// exclusive, of the source enlarged or reduced by `scaleX` and `scaleY` (destination pixels per
/// source pixel). The rectangle is placed as in the whole scaled picture, so drawing a part gives
/// the same pixels as drawing everything. Beyond the source its last row and column go on.
///
/// `dstBits` and `srcBits` are frame buffers of `dstWidth` x `dstHeight` and `srcWidth` x
/// `srcHeight` pixels with pitches in bytes; a source pitch may be negative. They may overlap, and
/// so may rows of the destination. A source row is resampled whole, into memory of its own, when a
/// destination row first needs it; as many are kept as one destination row may need (1 without
/// smoothing; with it the vertical step, rounded up, and 1 more; 32 at most), row r in place of the
/// one that is r modulo their number. Destination rows are drawn from these, from the top down. So
/// a picture can be reduced in place, with the same base and pitch.
///
/// The formats must be equal, with a depth and a number of bits per pixel (bpp) that are multiples
/// of 8; or the source is depth 24 in 32 bpp, and the destination depth is 24 or 16. The three
/// ignored arguments may have any value.
///
/// Positions are 16.16 fixed-point source pixels; the steps are 65536 / scale, truncated. Without
/// `smooth`, or for destination depths below 24 and pixels of more than 4 bytes, a destination
/// pixel is the source pixel at its position. Any non-zero `smooth` interpolates linearly in the
/// direction that is enlarged and averages in the one that is reduced:
/// - Enlarging starts half a source pixel back and mixes neighbours with weights of 1/256.
/// - Reducing averages the source pixels that the step covers, in a row first and then over at most
///   32 rows, with weights of 1/256.
///
/// Deliberate:
/// - The weights of a mix add up to 255/256, and a whole row weighs 255/256 in an average (a whole
///   column 256/256), so smoothed pixels are a shade darker.
/// - The last source column is no part of an average, and an average is divided by the whole step,
///   so a pixel that reaches past the right edge is darker. Pixels beyond are the last column's.
/// - When enlarging, pixels of the left and right edge are copied while rows of the upper and lower
///   edge are mixed with themselves.
/// - A vertical step of exactly one pixel takes rows as they are, smoothing or not. From 32 to 24
///   bpp such rows (and all rows without smoothing) take every fourth pixel of the resampled row,
///   then zeros, and leave the last pixel of each destination row unchanged.
/// - Sums of channels wrap at 32 bits, and so do start positions (step x coordinate); a vertical
///   position past 2^31 means row 0.
///
/// Returns true when the rectangle was drawn or there was nothing to draw (an empty rectangle, a
/// size of 0). Returns false, and draws nothing, in this order:
/// - when x1 or y1 is negative, or x2 or y2 beyond the destination;
///
/// - when dstBpp < dstDepth, with
///   Log("%s: Dest color format (depth %d, BPP %d) is not supported.\n");
///
/// - when the formats are no pair from above, with
///   Log("%s: Color depth conversion from D%dB%d to D%dB%d is not supported.\n");
///
/// - when dstBpp is no multiple of 8;
///
/// - when dstDepth is no multiple of 8 (so depth 15 is refused), with
///   Log("Raster_Scale: Dest depth %d is not supported.\n");
///
/// - when a size is 32768 or more;
/// - when a factor is not greater than 1/32767.
///
/// The name in these messages is "Raster_Scale". Each is logged at most once per process (a race of
/// threads cannot repeat it); that is all the state. Working memory comes from UtilSafeMalloc0.
RASTER_EXPORT bool Raster_Scale(void* dstBits, uint32 dstPitch, uint32 dstBpp, uint32 dstDepth,
                                uint32 dstWidth, uint32 dstHeight, uint32 dstIgnored, int32 x1,
                                int32 y1, int32 x2, int32 y2, const void* srcBits, int32 srcPitch,
                                uint32 srcBpp, int32 srcDepth, uint32 srcIgnored, uint32 srcWidth,
                                uint32 srcHeight, uint32 ignored, double scaleX, double scaleY,
                                int32 smooth);

/// Maps a rectangle of a scaled picture, in place, to the rectangle of the unscaled picture that
/// contributes to it, and returns its new bottom.
///
/// `width` and `height` are the size of the whole scaled picture; `invScaleX` and `invScaleY` are
/// unscaled pixels per scaled pixel. With m = max(1, invScale) the near side becomes
/// side * invScale - m, truncated, and 0 when that is negative; the far side becomes
/// ceil(side * invScale + m), at most the truncated size * invScale. So there is a margin of one
/// source pixel (of one step when reducing) for what smoothing mixes in. Only the near sides are
/// bounded below and only the far sides above. Numbers beyond 32 bits saturate.
RASTER_EXPORT int32 Raster_ScaleSrcCoordinates(Rect* rect, uint32 width, uint32 height,
                                               double invScaleX, double invScaleY);

/// @}

// ---- Cursors -----------------------------------------------------------------------------------

/// \defgroup raster_cursors Cursors
/// @{

/// The kinds of cursor: an AND and an XOR plane in the frame buffer's format, or pixels with alpha.
enum { RASTER_CURSOR_MASK = 0, RASTER_CURSOR_ALPHA = 1 };

/// A cursor: where it is, and then what its type has. The caller owns the planes.
///
/// A mask cursor's planes have `height` rows of `width` x (bpp / 8) bytes each, without gaps.
/// Screen pixels survive where the AND plane is all ones, and are inverted where the XOR plane is.
typedef struct RasterCursor {
  uint32 type;    ///< RASTER_CURSOR_...
  int32 hotX;     ///< the hot spot within the image, in pixels
  int32 hotY;     ///< its row
  uint32 width;   ///< in pixels
  uint32 height;  ///< in rows
  __extension__ union {
    uint8* pixels;  ///< RASTER_CURSOR_ALPHA: rows of 4-byte pixels as for Raster_AlphaBlend
    __extension__ struct {
      uint32 depth;  ///< RASTER_CURSOR_MASK
      uint32 bpp;
      uint8* andMask;
      uint8* xorMask;
    };
  };
} RasterCursor;

/// A frame buffer's size in pixels, format and pitch in bytes.
typedef struct RasterFrameBufferDesc {
  uint32 width;   ///< in pixels
  uint32 height;  ///< in rows
  uint32 depth;   ///< colour depth in bits
  uint32 bpp;     ///< bits per pixel in memory
  uint32 pitch;   ///< bytes from one row to the next
} RasterFrameBufferDesc;

/// The visible part of a cursor: its place and size in the frame buffer, and its first column and
/// row in the cursor's image.
typedef struct RasterCursorBox {
  int32 x;       ///< the left edge in the frame buffer, in pixels
  int32 y;       ///< the top edge there
  int32 width;   ///< of the visible part, in pixels
  int32 height;  ///< in rows
  int32 srcX;    ///< the first visible column of the cursor
  int32 srcY;    ///< the first visible row
} RasterCursorBox;

/// The bytes of a cursor plane whose rows are padded to a multiple of 32 bits:
/// (width x bitsPerPixel + 31) / 32 x 4 bytes a row. 0xFFFFFFFF where the product, the sum or the
/// whole does not fit 32 bits; rows are checked even when there are none.
RASTER_EXPORT uint32 Raster_CalculateCursorSize(uint32 width, uint32 height, uint32 bitsPerPixel);

/// Expands a plane of 1-bit pixels to pixels of `bitsPerPixel` / 8 bytes (1 to 4; nothing happens
/// for other sizes): a set bit gives a pixel of ones, a clear bit one of zeros. Bits are taken from
/// the highest down. Rows of both planes are padded as by Raster_CalculateCursorSize; the padding
/// of `dst` is not written. Ends in Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterCursor"
/// when the plane has more than `dstSize` bytes.
RASTER_EXPORT void Raster_ExpandCursorBitPlane(uint32 width, uint32 height, uint32 bitsPerPixel,
                                               const uint8* bits, uint8* dst, uint32 dstSize);

/// Stores the AND plane and behind it the XOR plane of a cursor in `dst`, each of
/// Raster_CalculateCursorSize(width, height, bitsPerPixel) bytes. A plane of depth 1 is expanded as
/// by Raster_ExpandCursorBitPlane, one of depth `bitsPerPixel` copied with its padding. Ends in
/// Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterCursor" when both planes need more than
/// `dstSize` bytes, or for any other depth; the AND plane is stored before `xorDepth` is looked at.
RASTER_EXPORT void Raster_ExpandPlanarCursorData(uint32 width, uint32 height, uint32 andDepth,
                                                 const uint8* andBits, uint32 xorDepth,
                                                 const uint8* xorBits, uint32 bitsPerPixel,
                                                 uint8* dst, uint32 dstSize);

/// Clips a cursor, placed with its hot spot at (x, y), to the frame buffer. Returns false, and
/// leaves `box` alone, when nothing of it is visible. Sizes of the cursor above 2^31 - 1 count as
/// negative.
RASTER_EXPORT bool Raster_ComputeCursorBox(const RasterFrameBufferDesc* fb,
                                           const RasterCursor* cursor, int32 x, int32 y,
                                           RasterCursorBox* box);

/// Draws the part of a cursor that `box` (from Raster_ComputeCursorBox) names.
///
/// When `saveBits` is null the cursor is drawn into the frame buffer. Otherwise the area of the box
/// is first copied to the top left of `saveBits`, with rows of `savePitch` bytes, and the cursor
/// drawn into that copy; the frame buffer is left unchanged. An alpha cursor is blended as by
/// Raster_AlphaBlendOver, in place. A mask cursor is drawn as by Raster_RectROPcopy, the AND plane
/// with operation 1 and then the XOR plane with operation 6 (so rows after the first step by a
/// rounded pitch).
///
/// Ends in Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterCursor", after the copy, for a
/// mask cursor whose depth or bpp is not the frame buffer's and for any other type.
RASTER_EXPORT void Raster_DrawCursor(uint8* fbBits, const RasterFrameBufferDesc* fb,
                                     uint8* saveBits, uint32 savePitch, const RasterCursor* cursor,
                                     const RasterCursorBox* box);

/// The sizes of a cursor of 4-byte pixels scaled by `scaleX` and `scaleY`, and its hot spot there.
///
/// For smoothing to spread, the cursor gets a margin of max(1 / scale, scale) + 1 pixels on every
/// side (numbers toward zero), which gives the padded size; the scaled size is that times the
/// factors, rounded up. `scaledHot[0]` and `[1]` are (hot spot + margin) x factor, toward zero.
/// Returns scaledWidth x 4 x scaledHeight, the bytes of the scaled image. Sizes wrap at 2^32.
RASTER_EXPORT uint32 Raster_GetScaledCursorSize(uint32* paddedWidth, uint32* paddedHeight,
                                                uint32* scaledWidth, uint32* scaledHeight,
                                                int32* scaledHot, uint32 width, uint32 height,
                                                double scaleX, double scaleY, int32 hotX,
                                                int32 hotY);

/// Scales the pixels of an alpha cursor into `dst`, smoothly and with a clear margin. Sizes are
/// those that Raster_GetScaledCursorSize gave for the same cursor and factors; rows of `dst` are 4
/// x scaledWidth bytes. The scaling is that of Raster_Scale, and `dst` is left alone where that
/// refuses. Where a cursor and its margins do not fit the padded size (a factor that is no number),
/// the padding alone is scaled. Working memory of paddedWidth x 4 x paddedHeight bytes comes from
/// UtilSafeMalloc0, which ends the process when there is none.
RASTER_EXPORT void Raster_ScaleAlphaCursor(uint8* dst, const RasterCursor* cursor, double scaleX,
                                           double scaleY, uint32 paddedWidth, uint32 paddedHeight,
                                           uint32 scaledWidth, uint32 scaledHeight);

/// Scales both planes of a mask cursor, which must be 4-byte pixels, to their nearest pixels: the
/// AND plane with a margin of ones, the XOR plane with one of zeros. Otherwise as
/// Raster_ScaleAlphaCursor.
RASTER_EXPORT void Raster_ScaleColorCursor(uint8* andDst, uint8* xorDst, const RasterCursor* cursor,
                                           double scaleX, double scaleY, uint32 paddedWidth,
                                           uint32 paddedHeight, uint32 scaledWidth,
                                           uint32 scaledHeight);

/// @}

// ---- Video -------------------------------------------------------------------------------------

/// \defgroup raster_video Video
/// @{

/// How a component is put into a channel: ((component * multiplier) >> shift) & mask.
typedef struct RasterRGBParam {
  uint32 multiplier;  ///< applied first, modulo 2^32
  uint32 shift;       ///< then to the right, in bits
  uint32 mask;        ///< the bits of the channel
} RasterRGBParam;

/// The frame layouts of Raster_YUVtoRGB: four characters, the first one in the low byte.
enum {
  RASTER_VIDEO_YUY2 = 0x32595559,
  RASTER_VIDEO_UYVY = 0x59565955,
  RASTER_VIDEO_YV12 = 0x32315659
};

/// Converts a video frame to packed RGB by the BT.601 equation with limited range:
///
///   R = (298 (Y - 16) + 409 (Cr - 128) + 128) >> 8
///   G = (298 (Y - 16) - 100 (Cb - 128) - 208 (Cr - 128) + 128) >> 8
///   B = (298 (Y - 16) + 516 (Cb - 128) + 128) >> 8
///
/// with an arithmetic shift, each limited to 0..255. `width` and `height` are in pixels.
///
/// `format` is one of RASTER_VIDEO_...:
/// - "YUY2" and "UYVY": width x height / 2 groups of four bytes, without row padding: Y0 Cr Y1 Cb,
/// and Cr Y0 Cb Y1. With an odd number of pixels the last one is not
///   written.
/// - "YV12": a plane of Y, one of Cb and one of Cr, each right after the other. Rows
///   of Y are `width` rounded up to even bytes apart and their number is `height` rounded up to
///   even; the other planes have half of both. A last odd row or column is not written.
///
/// Deliberate: in the packed formats the first chroma byte of a group is the red-difference, and in
/// the planar one the plane after Y is the blue-difference. Standard frames of these names have
/// them the other way round: docs/video.md.
///
/// `bppdepth` is the output format; rows of width x bytes per pixel follow each other without a
/// gap:
/// - 15: 2 bytes, R in bits 11-15, G in 6-10, B in 1-5. Deliberate: one bit higher than the 15-bit
///   pixels of the rest of the library; bit 0 is 0.
/// - 16: 2 bytes, R in bits 11-15, G in 5-10, B in 0-4.
/// - 24: 3 bytes, B, G, R. 32: 4 bytes, B, G, R, 0.
///
/// Deliberate: with "YV12" and an odd width, each pair of output rows begins one pixel earlier than
/// in a picture, once more for every pair before it.
///
/// Any other `bppdepth` (looked at first) or format leaves `dst` untouched and logs, the first time
/// in the process, Log("Raster_YUVtoRGB: bppdepth:%d not supported.\n") or
/// Log("Raster_YUVtoRGB: format:%u not supported.\n"). Source and destination may have any
/// alignment. They must not overlap: what is stored then differs between instruction-set levels,
/// but for a packed frame that is converted to 15 or 16 bits in place or to a `dst` before `src`.
/// The size of the source is trusted.
RASTER_EXPORT void Raster_YUVtoRGB(const uint8* src, uint8* dst, uint32 width, uint32 height,
                                   uint32 format, int32 bppdepth);

/// One pixel 0x00RRGGBB of a luma, blue-difference `u` and red-difference `v`, by the equation of
/// Raster_YUVtoRGB. Deliberate: without the rounding term 128, so that white (235, 128, 128) is
/// 0x00FEFEFE.
RASTER_EXPORT uint32 RasterRGB_YUVtoBGRX(uint8 y, uint8 u, uint8 v);

/// Fills `param` so that a component of `bits` bits is put into the lowest run of set bits of
/// `mask`: a narrower field gets its top bits, a wider one the component repeated. Returns the
/// multiplier. With a total (the length of the run rounded up to a multiple of `bits`):
/// multiplier = (2^total - 1) / (2^bits - 1), cut to 32 bits; shift = total - length - position of
/// the run; where that is negative, the multiplier is shifted left by as much and the shift is 0.
///
/// `bits` must be 1 to 32 and `mask` not 0: debug builds assert it.
RASTER_EXPORT uint32 RasterRGB_MakeRGBParam(RasterRGBParam* param, uint32 bits, uint32 mask);

/// @}

// ---- Compression -------------------------------------------------------------------------------

/// \defgroup raster_compression Compression
/// @{

/// Packs an image into a new block: five 32-bit words (width, height, pitch in bytes, bits per
/// pixel, number of code words; in the machine's byte order) and a payload. docs/compression.md has
/// the code.
///
/// `src` is one flat run of height x pitch bytes of any alignment; `pitch` is in bytes, 0 stands
/// for width x pixel size. Images of 32 bits per pixel are run-length coded if that is shorter,
/// counted in whole pixels (height x pitch / 4, rounded down); otherwise, and for 8, 16 and 24
/// bits, the number of code words is 0 and the payload is the pixels as they are.
///
/// `outBlock` receives the block and `outSize` its length in bytes. The block comes from
/// UtilSafeMalloc0, which never fails; the caller releases it with free. `outBlock` is set before
/// the pixels are looked at.
///
/// Any other `bpp` ends in Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/raster/rasterCompress" and
/// 114. So does, with another line, a block whose length would not fit `outSize` and an image of
/// more pixels than 32 bits (on 32-bit x86, memory) can count.
RASTER_EXPORT void Raster_Compress(const void* src, uint32 pitch, uint32 bpp, uint32 width,
                                   uint32 height, uint8** outBlock, uint32* outSize);

/// Unpacks a block: stores the pitch in bytes, bits per pixel, width and height of its header, and
/// in `outData` a new buffer of height x pitch bytes from UtilSafeMalloc0, which the caller
/// releases with free. Bytes of the buffer that the code does not write are zero.
///
/// Deliberate: the pixels of a block without code words are copied to the place where `outData`
/// points, height x pitch bytes over the caller's pointer and what follows it, and not to the new
/// buffer, which stays as allocated and can no longer be reached through `outData`. A caller that
/// meets such blocks (word 4 of the header is 0) takes the pixels from the block, at byte 20.
///
/// A code with 8, 16 or 24 bits per pixel ends in Panic("NOT_IMPLEMENTED %s:%d\n") with
/// "lib/raster/rasterCompress" and 187; with any other number but 32 the buffer is returned as
/// allocated. The block is trusted: a code that claims more pixels than the header runs over the
/// buffer's end.
RASTER_EXPORT void Raster_Decompress(const uint8* block, uint8** outData, uint32* outPitch,
                                     uint32* outBpp, uint32* outWidth, uint32* outHeight);

/// @}

#ifdef __cplusplus
}
#endif

#endif
