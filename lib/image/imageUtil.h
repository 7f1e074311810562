// SPDX-License-Identifier: MIT
/// \file
/// Images in memory: read from PNG, written as PNG and BMP, combined, cropped and scaled.
///
/// Conventions that hold for every function unless it says otherwise:
/// - An image is an ImageUtilImage record of the caller. Its pixels are one block of `height` rows
///   of `bytesPerLine` bytes. Colours lie in memory as blue, green, red.
/// - A function that fails returns false and says nothing. libpng's own messages about a stream
///   that it cannot read or write go to standard error, as libpng has them.
/// - Pixels that a function hands out come from malloc and belong to the record; release them with
///   ImageUtil_FreeImageData.
/// - Memory: decoding and cropping allocate with UtilSafeMalloc0 and UtilSafeCalloc0, which end the
///   process when there is none (for decoding that may be height x bytesPerLine bytes, whatever the
///   stream really holds: look at its header first). Every other function returns false.
/// - No pointer may be null unless the function says what happens then. Records, pixels, streams
///   and buffers must not overlap one another.
/// - No function keeps state or takes a lock; calls on different records may run on several
///   threads.

#ifndef RASTER_IMAGE_UTIL_H
#define RASTER_IMAGE_UTIL_H

#include "baseTypes.h"
#include "dynBuf.h"
#include "rasterExport.h"

#ifdef __cplusplus
extern "C" {
#endif

/// \defgroup image_records Images and choices
/// @{

struct png_struct_def;  // libpng's structure; png_structp is a pointer to it

/// One palette entry, in the order of memory of a 32-bit pixel.
typedef struct ImageUtilColor {
  uint8 blue;      ///< 0 to 255
  uint8 green;     ///< 0 to 255
  uint8 red;       ///< 0 to 255
  uint8 reserved;  ///< written as 0, never read
} ImageUtilColor;

/// In ImageUtilImage::flags. Other bits are ignored.
enum {
  IMAGE_FLAG_BOTTOM_UP = 1  ///< the first row in memory is the bottom row of the picture
};

/// An image. The record is the caller's, the palette lies in it.
typedef struct ImageUtilImage {
  uint32 width;         ///< pixels in a row
  uint32 height;        ///< rows
  uint32 depth;         ///< colour depth in bits: 8 with a palette, 15, 16 or 24 without
  uint32 bpp;           ///< bits per pixel in memory: 8 (or fewer) with a palette, 16, 24 or 32
  uint32 bytesPerLine;  ///< from one row to the next
  uint32 flags;         ///< IMAGE_FLAG_...
  uint32 numColors;     ///< valid palette entries, at most 256
  ImageUtilColor palette[256];  ///< what the indices of 8 bpp stand for
  uint8* data;  ///< the rows; 24 bpp are blue, green, red; 32 bpp have alpha or a filler after them
} ImageUtilImage;

/// Flags for reading. Other bits are ignored.
enum {
  IMAGE_UTIL_READ_KEEP_ALPHA = 1  ///< RGB with alpha gives 32 bpp, not 24 without the alpha
};

/// File types of ImageUtil_WriteImage.
enum { IMAGE_UTIL_TYPE_PNG = 0, IMAGE_UTIL_TYPE_BMP = 1 };

/// Choices for writing PNG. Where a pointer to them is null, -1 and true hold.
typedef struct ImageUtilPNGWriteParams {
  int32 compressionLevel;  ///< zlib's, 0 to 9; any other number leaves libpng's default
  bool stripAlpha;         ///< 32 bpp only: true writes RGB, false RGB with byte 3 as alpha
} ImageUtilPNGWriteParams;

/// A host's memory. Each operation is given `context` first.
typedef struct ImageUtilMemOps {
  void* context;                                                 ///< whatever the host likes
  void* (*alloc)(void* context, size_t size);                    ///< null when there is no memory
  void (*free)(void* context, void* block);                      ///< must accept null
  void* (*realloc)(void* context, void* block, size_t newSize);  ///< null: `block` is as it was
} ImageUtilMemOps;

/// What ImageUtilReadPngCallback expects behind libpng's I/O pointer.
typedef struct ImageUtilReadPngCtx {
  const uint8* start;  ///< the first byte of the stream
  uint32 consumed;     ///< bytes read so far; begins at 0
} ImageUtilReadPngCtx;

/// What ImageUtilBufferWriteCallback expects behind libpng's I/O pointer.
typedef struct ImageUtilBufferWriteCtx {
  uint8* buffer;                  ///< begins as null
  uint32 used;                    ///< bytes written; begins at 0
  uint32 capacity;                ///< bytes allocated; begins at 0
  const ImageUtilMemOps* memops;  ///< where the buffer comes from
} ImageUtilBufferWriteCtx;

/// @}

// ---- Reading -----------------------------------------------------------------------------------

/// \defgroup image_reading Reading
/// @{

/// Decodes the PNG stream of `size` bytes at `png`. True on success.
///
/// Images with a palette (1, 2, 4 or 8 bits) give depth 8, 8 bpp, one index a byte and `numColors`
/// as in the file; transparency of the palette is ignored. RGB gives depth 24, 24 bpp. RGB with
/// alpha gives depth 24 and, by `readFlags`, 32 bpp with the alpha or 24 bpp without. Grey images
/// are not decoded. The top row comes first, `flags` is 0, `bytesPerLine` a multiple of 4, and the
/// padding of the rows is zero. Interlaced files need nothing special.
///
/// Deliberate: the stream is trusted to be whole. `size` is compared with 0 and with the 8 bytes of
/// the signature only; a stream that was cut off is read past its end. ImageUtil_ReadPNG has no
/// such trust in files.
///
/// Deliberate: files with 16 bits a sample keep them. Their rows are twice as wide as depth and bpp
/// say, each sample with its high byte first.
///
/// On failure `*image` is
/// - as it was when an argument is null or `size` is 0;
/// - all zero when the signature is wrong, libpng finds an error before the pixels, or the image is
///   grey;
/// - filled, with the rows decoded so far, when libpng finds an error in the pixels or after them:
///   call ImageUtil_FreeImageData also then (in all three cases it does no harm on a record that
///   was valid before). Sizes that memory cannot address fail with the fields filled and no data.
RASTER_EXPORT bool ImageUtil_ReadPNGBuffer(ImageUtilImage* image, const uint8* png, uint32 size,
                                           uint8 readFlags);

/// Reads the file at `pathName` and decodes it as ImageUtil_ReadPNGBuffer does. A file that cannot
/// be read, is empty or has 4 GiB or more gives false with `*image` as it was. The end of the file
/// is the end of the stream: a file that was cut off is an error of libpng's kind.
RASTER_EXPORT bool ImageUtil_ReadPNG(ImageUtilImage* image, const char* pathName, uint8 readFlags);

/// Releases `image->data`, which may be null, and sets it to null. Other fields stay.
RASTER_EXPORT void ImageUtil_FreeImageData(ImageUtilImage* image);

/// The read function given to libpng, for hosts that drive libpng themselves: copies `length` bytes
/// from the stream of the ImageUtilReadPngCtx behind libpng's I/O pointer. Deliberate: it knows no
/// end of the stream.
RASTER_EXPORT void ImageUtilReadPngCallback(struct png_struct_def* png, uint8* dest, size_t length);

/// @}

// ---- Encoding ----------------------------------------------------------------------------------

/// \defgroup image_encoding Encoding
/// @{

/// Encodes an image as PNG into `out`, which is initialised here and is the caller's to destroy.
///
/// Up to 8 bpp the file has a palette of `numColors` entries and one byte a pixel; 24 bpp is
/// written as RGB; 32 bpp as `params` says; anything else (16 bpp) is converted to RGB. A bottom-up
/// image gives the same file as the same picture top-down. The file holds the header, the palette,
/// the pixels and the end, no other chunk.
///
/// Deliberate: images of fewer than 8 bpp are taken to hold one index a byte.
///
/// Returns false, with `out` untouched, when `image` or `out` is null; false, with `out` destroyed,
/// when memory is exhausted, `numColors` is over 256 (up to 8 bpp), or libpng refuses the image (no
/// rows, no columns, no palette entries, over a million of either). A format that
/// Raster_ConvertPixels does not know is fatal as it says.
RASTER_EXPORT bool ImageUtil_ConstructPNGBuffer(const ImageUtilImage* image,
                                                const ImageUtilPNGWriteParams* params, DynBuf* out);

/// As ImageUtil_ConstructPNGBuffer, into a buffer from the host's memory. On success `*outBuffer`
/// and `*outSize` are set, and the caller releases the buffer with its `free` operation (the block
/// is larger than the file). On failure `*outSize` is 0, `*outBuffer` stays as it was, and `free`
/// has been called with what was allocated so far, which may be null. A null `outBuffer`, `outSize`
/// or `memops` gives false and nothing else.
RASTER_EXPORT bool ImageUtil_ConstructPNGBufferWithMemOps(const ImageUtilImage* image,
                                                          const ImageUtilPNGWriteParams* params,
                                                          uint8** outBuffer, uint32* outSize,
                                                          const ImageUtilMemOps* memops);

/// A write function for libpng: appends to the buffer of the ImageUtilBufferWriteCtx behind
/// libpng's I/O pointer. When the bytes do not fit, the buffer is reallocated to twice the bytes
/// then used plus 1024. When that fails, or the result would not fit the record, the buffer is
/// released, the context has none, and libpng's error "Unable to append data: Out of memory" is
/// raised.
RASTER_EXPORT void ImageUtilBufferWriteCallback(struct png_struct_def* png, uint8* data,
                                                size_t length);

/// A write function for libpng: appends to the DynBuf that is libpng's I/O pointer. When that fails
/// libpng's error "Unable to append data" is raised.
RASTER_EXPORT void ImageUtilDynBufWriteCallback(struct png_struct_def* png, uint8* data,
                                                size_t length);

/// Encodes an image as an uncompressed BMP file, bottom row first, into `out`, which is initialised
/// here and is the caller's to destroy.
///
/// 8 bpp keeps its indices and its palette of `numColors` entries; everything else becomes 24 bits
/// blue, green, red. Rows of 8 and 24 bpp are copied up to the next multiple of 4 bytes, so
/// `bytesPerLine` must reach that far; the padding of other rows is zero.
///
/// Deliberate: below 8 bpp the file consists of the headers and the palette.
///
/// Returns false, with `out` untouched, when `image` or `out` is null, `numColors` is over 256 (up
/// to 8 bpp), the file would have 4 GiB or more, or working memory is exhausted; false, with `out`
/// destroyed, when it cannot grow. A format that Raster_ConvertPixels does not know is fatal as it
/// says.
RASTER_EXPORT bool ImageUtil_ConstructBMPBuffer(const ImageUtilImage* image, DynBuf* out);

/// @}

// ---- Writing to files --------------------------------------------------------------------------

/// \defgroup image_files Writing to files
/// @{

/// Encodes an image and writes it to a file, which is created or truncated. `imageType` is an
/// IMAGE_UTIL_TYPE_... (PNG with the default parameters); any other number is fatal:
/// Panic("NOT_IMPLEMENTED %s:%d\n") with "lib/image/imageUtil". An image that cannot be encoded
/// gives false before the file is touched. An error of the file gives false, leaves the file as it
/// is and is told by one of
///   Log("%s: Failed open file '%s': %s (%d)\n", "ImageUtilWriteBuf", path, text, code)
///   Log("%s: Failed to write file '%s': %s (%d)\n", "ImageUtilWriteBuf", path, text, code)
///   Log("%s: Wrong number of image bytes written to '%s': %s (%d)\n", "ImageUtilWriteBuf", path,
///       text, 0)
/// with FileIO's code and text (the last one with those of success).
RASTER_EXPORT bool ImageUtil_WriteImage(const ImageUtilImage* image, const char* pathName,
                                        uint32 imageType);

/// As ImageUtil_WriteImage for PNG, with parameters (may be null).
RASTER_EXPORT bool ImageUtil_WritePNG(const ImageUtilImage* image, const char* pathName,
                                      const ImageUtilPNGWriteParams* params);

/// @}

// ---- Putting together and cutting --------------------------------------------------------------

/// \defgroup image_combining Putting together and cutting
/// @{

/// Lays `count` images out into one. `positions` has x and y of each, relative to any origin; the
/// result is their bounding rectangle, later images over earlier ones. Images without data count
/// for the size and are not drawn. `*result` is overwritten (not released first) and may be one of
/// `images`; `count` 0 gives a zeroed record.
///
/// When the images leave gaps or overlap, the result is depth 24 at 32 bpp, transparent black in
/// the gaps and opaque elsewhere; otherwise, or when the first image has 32 bpp already, it has the
/// format of the first image and the pixels are copied. Palettes are not carried over: convert such
/// images first.
///
/// Deliberate: whether there are gaps is told from the areas alone, so a gap and an overlap of
/// equal area cancel out; and every image is taken to have the format of the first.
///
/// False, with `*result` as it was, when memory does not suffice.
RASTER_EXPORT bool ImageUtil_Combine(const ImageUtilImage* images, const int32* positions,
                                     uint32 count, ImageUtilImage* result);

/// Cuts the rectangle [left, right) x [top, bottom) out of an image and scales it, smoothly where
/// Raster_Scale can, to `newWidth` x `newHeight`.
///
/// -1 for `right` or `bottom` stands for the image's size; -1 for one of the new sizes keeps the
/// shape of the crop (the product first, 32 bits, truncating), for both the crop's size. `dstX` and
/// `dstY` must be 0. Rows are taken as stored: `flags` is not looked at, and `top` counts from the
/// first row in memory. `*result` gets the source's format, no flags and no palette, rows padded to
/// a multiple of 4 with zeros, and fresh pixels; it is overwritten (not released first).
///
/// Deliberate: whether the pixels can be scaled is not reported. Where Raster_Scale refuses (15-bit
/// colour, sizes of 32768 and more) they are zero. A crop of the full width that is not scaled is
/// copied as one block, which takes `bytesPerLine` to be that of the result.
///
/// False, with `*result` as it was, for a negative `left` or `top`, a far edge that is not beyond
/// the near one or is beyond the image, a new size of 0, a shape to keep where the crop is empty,
/// rows of 2 GiB and more that would have to be scaled, or a result that memory cannot address. An
/// empty crop (`left` at the width with `right` -1) and
/// a new size that truncates to 0 give an empty image and true.
RASTER_EXPORT bool ImageUtil_CropAndScaleImage(const ImageUtilImage* src, int32 left, int32 top,
                                               int32 right, int32 bottom, int32 dstX, int32 dstY,
                                               int32 newWidth, int32 newHeight,
                                               ImageUtilImage* result);

/// @}

#ifdef __cplusplus
}
#endif

#endif
