// SPDX-License-Identifier: MIT
//
// Every allocation of every function refused in turn: the status says so, outputs are left alone,
// nothing leaks and nothing is said. And how much is held at most while a picture is read.

#include <gtest/gtest.h>
#include <malloc.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <functional>
#include <string>

#include "checked/checkedScenes.h"
#include "image/pngFiles.h"
#include "rasterChecked.h"
#include "support/viewImages.h"

// The allocator of this program: the C library's, with a count and a point where memory ends.
extern "C" {
void* __libc_malloc(size_t size);
void* __libc_calloc(size_t count, size_t size);
void* __libc_realloc(void* block, size_t size);
void __libc_free(void* block);
}

namespace {

bool counting = false;
bool sticky = false;
int untilRefused = 0;  // allocations that are still granted; negative: all
int refused = 0;
int64 blocks = 0;
int64 held = 0;
int64 most = 0;

bool isRefused() {
  if (!counting || untilRefused < 0) return false;
  if (untilRefused > 0) {
    --untilRefused;
    return false;
  }
  ++refused;
  if (!sticky) untilRefused = -1;
  return true;
}

void add(void* block, int64 sign) {
  if (!counting || block == nullptr) return;
  blocks += sign;
  held += sign * static_cast<int64>(malloc_usable_size(block));
  most = std::max(most, held);
}

}  // namespace

extern "C" {

void* malloc(size_t size) {
  if (isRefused()) return nullptr;
  void* block = __libc_malloc(size);
  add(block, 1);
  return block;
}

void* calloc(size_t count, size_t size) {
  if (isRefused()) return nullptr;
  void* block = __libc_calloc(count, size);
  add(block, 1);
  return block;
}

void* realloc(void* block, size_t size) {
  if (isRefused()) return nullptr;
  add(block, -1);
  void* moved = __libc_realloc(block, size);
  add(moved != nullptr ? moved : block, 1);
  return moved;
}

void free(void* block) {
  add(block, -1);
  __libc_free(block);
}

}  // extern "C"

namespace {

using tests::Bytes;
using tests::Random;

/// A call that allocates: its status, and what it would hand out. `release` undoes a success.
struct Call {
  std::string name;
  std::function<RasterStatus()> run;
  std::function<bool()> leftAlone;
  std::function<void()> release;
};

/// Runs a call with memory that ends after `granted` allocations.
RasterStatus runWith(const Call& call, int granted, bool stays) {
  refused = 0;
  blocks = held = most = 0;
  untilRefused = granted;
  sticky = stays;
  counting = true;
  const RasterStatus status = call.run();
  if (status == RASTER_STATUS_OK) call.release();
  counting = false;
  return status;
}

struct Outputs {
  uint8* bytes = nullptr;
  size_t size = 77;
  ImageUtilImage image = {};
  RasterView view = {};

  bool leftAlone() const {
    return bytes == nullptr && size == 77 && image.data == nullptr && image.width == 0 &&
           view.data == nullptr;
  }
  void release() {
    free(bytes);
    free(image.data);
    free(view.data);
    *this = {};
  }
};

ImageUtilImage imageOf(const RasterView& view) {
  ImageUtilImage image = tests::imageOn(view);
  image.numColors = 256;
  return image;
}

tests::PngPicture rgbPicture(uint32 width, uint32 height, int interlace = PNG_INTERLACE_NONE) {
  tests::PngPicture p;
  p.width = width;
  p.height = height;
  p.interlace = interlace;
  p.rows = Random(111).bytes(size_t{3} * width * height);
  return p;
}

class RasterCheckedMemory : public testing::Test {
 protected:
  Call callFor(const std::string& name, std::function<RasterStatus()> run) {
    return {name, std::move(run), [this] { return out.leftAlone(); }, [this] { out.release(); }};
  }

  /// Refuses the first, the second ... allocation of a call until it makes do.
  void refuseInTurn(const Call& call) {
    testing::internal::CaptureStderr();
    bool done = false;
    int granted = 0;
    for (; !done && granted < 1000; ++granted) {
      for (const bool stays : {false, true}) {
        const RasterStatus status = runWith(call, granted, stays);
        done = refused == 0;
        EXPECT_EQ(blocks, 0) << call.name << " leaks after " << granted;
        if (done) {
          EXPECT_EQ(status, RASTER_STATUS_OK) << call.name;
        } else if (status != RASTER_STATUS_OK) {
          EXPECT_EQ(status, RASTER_STATUS_NO_MEMORY) << call.name << " after " << granted;
          EXPECT_TRUE(call.leftAlone()) << call.name << " after " << granted;
        }
      }
    }
    EXPECT_TRUE(done) << call.name;
    EXPECT_GT(granted, 1) << call.name << " allocates nothing";
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "") << call.name;
  }

  Random random{112};
  Outputs out;
};

TEST_F(RasterCheckedMemory, PngReading) {
  for (const int interlace : {PNG_INTERLACE_NONE, PNG_INTERLACE_ADAM7}) {
    const Bytes stream = makePng(rgbPicture(300, 600, interlace));
    refuseInTurn(callFor("ReadPngBuffer", [&] {
      return RasterChecked_ReadPngBuffer(stream.data(), stream.size(), 0, nullptr, &out.image,
                                         nullptr, 0);
    }));
  }
}

TEST_F(RasterCheckedMemory, Encoders) {
  for (const tests::PixelFormat format : {tests::PixelFormat{8, 8}, {16, 16}, {24, 24}, {24, 32}}) {
    const tests::GuardedView view(random, format, 101, 50, false);
    const ImageUtilImage image = imageOf(view.view());
    refuseInTurn(callFor("EncodePng", [&] {
      return RasterChecked_EncodePng(&image, view.view().bytes, nullptr, &out.bytes, &out.size);
    }));
    refuseInTurn(callFor("EncodeBmp", [&] {
      return RasterChecked_EncodeBmp(&image, view.view().bytes, &out.bytes, &out.size);
    }));
  }
}

TEST_F(RasterCheckedMemory, Blocks) {
  const tests::GuardedView view(random, {24, 32}, 50, 50, false);
  refuseInTurn(
      callFor("Compress", [&] { return RasterChecked_Compress(&view, &out.bytes, &out.size); }));
  Bytes same(view.view().bytes, 3);
  const RasterView runs = {same.data(), same.size(), 200, 50, 50, 24, 32};
  for (const RasterView* from : {&view, &runs}) {
    uint8* block = nullptr;
    size_t size = 0;
    ASSERT_EQ(RasterChecked_Compress(from, &block, &size), RASTER_STATUS_OK);
    refuseInTurn(callFor(
        "Decompress", [&] { return RasterChecked_Decompress(block, size, nullptr, &out.view); }));
    free(block);
  }
}

TEST_F(RasterCheckedMemory, Images) {
  const tests::GuardedView view(random, {24, 24}, 50, 50);
  const ImageUtilImage images[2] = {imageOf(view.view()), imageOf(view.view())};
  const size_t bytes[2] = {view.view().bytes, view.view().bytes};
  const int32 positions[4] = {0, 0, 10, 10};
  refuseInTurn(callFor("Combine", [&] {
    return RasterChecked_Combine(images, bytes, positions, 2, nullptr, &out.image);
  }));
  refuseInTurn(callFor("CropAndScale", [&] {
    return RasterChecked_CropAndScale(&images[0], bytes[0], 1, 2, -1, -1, 3000, 40, nullptr,
                                      &out.image);
  }));
  refuseInTurn(callFor("CropAndScale", [&] {
    return RasterChecked_CropAndScale(&images[0], bytes[0], 1, 2, 9, 9, -1, -1, nullptr,
                                      &out.image);
  }));
}

TEST_F(RasterCheckedMemory, Scaling) {
  for (const tests::PixelFormat format : {tests::PixelFormat{8, 8}, {16, 16}, {24, 24}, {24, 32}}) {
    const tests::GuardedView src(random, format, 900, 80);
    tests::GuardedView dst(random, format, 20000, 10);
    const Bytes before = dst.bytes();
    for (const double factor : {3.3, 0.09}) {
      refuseInTurn({"Scale",
                    [&] { return RasterChecked_Scale(&dst, nullptr, &src, 22.3, factor, 1, 0); },
                    [&] { return dst.bytes() == before; }, [&] { dst.assign(before); }});
    }
  }
}

TEST_F(RasterCheckedMemory, Cursors) {
  tests::GuardedView first(random, {24, 32}, 32, 32, false);
  tests::GuardedView second(random, {24, 32}, 32, 32, false);
  RasterCursor mask = {};
  mask.type = RASTER_CURSOR_MASK;
  mask.width = mask.height = 32;
  mask.depth = 24;
  mask.bpp = 32;
  mask.andMask = first.view().data;
  mask.xorMask = second.view().data;
  RasterCursor alpha = mask;
  alpha.type = RASTER_CURSOR_ALPHA;
  alpha.pixels = first.view().data;
  Bytes dst(size_t{2} * 4 * 300 * 300, 5);
  const Bytes before = dst;
  for (const RasterCursor* cursor : {&mask, &alpha}) {
    refuseInTurn({"ScaleCursor",
                  [&] {
                    return RasterChecked_ScaleCursor(cursor, 4096, 5.5, 5.5, nullptr, dst.data(),
                                                     dst.size(), nullptr);
                  },
                  [&] { return dst == before; },
                  [&] { memcpy(dst.data(), before.data(), dst.size()); }});
  }
}

TEST_F(RasterCheckedMemory, Files) {
  char path[] = "/tmp/checkedMemoryXXXXXX";
  close(mkstemp(path));
  const Bytes stream = makePng(rgbPicture(20, 20));
  ASSERT_EQ(RasterChecked_WriteFile(path, stream.data(), stream.size(), 0), RASTER_STATUS_OK);
  refuseInTurn(callFor(
      "ReadFile", [&] { return RasterChecked_ReadFile(path, nullptr, &out.bytes, &out.size); }));
  refuseInTurn(callFor(
      "ReadPng", [&] { return RasterChecked_ReadPng(path, 0, nullptr, &out.image, nullptr, 0); }));
  unlink(path);
}

// ---- How much ----------------------------------------------------------------------------------

constexpr int64 kMebibyte = 1 << 20;

TEST_F(RasterCheckedMemory, IsBoundedWhileAPictureIsRead) {
  for (const int interlace : {PNG_INTERLACE_NONE, PNG_INTERLACE_ADAM7}) {
    for (const uint32 height : {1u, 200u, 3000u}) {
      tests::PngPicture picture = rgbPicture(2000, height, interlace);
      const Bytes stream = makePng(picture);
      const Call call = callFor("", [&] {
        return RasterChecked_ReadPngBuffer(stream.data(), stream.size(), 0, nullptr, &out.image,
                                           nullptr, 0);
      });
      ASSERT_EQ(runWith(call, -1, false), RASTER_STATUS_OK);
      const int64 pixels = int64{6000} * height;
      EXPECT_LE(most, pixels + 4 * static_cast<int64>(stream.size()) + kMebibyte) << height;
    }
  }
}

TEST_F(RasterCheckedMemory, GrowsWithTheRows) {
  // 48 MB of black pixels in a small file that is damaged early on.
  tests::PngPicture picture;
  picture.width = 4000;
  picture.height = 4000;
  picture.rows.assign(size_t{3} * 4000 * 4000, 0);
  Bytes stream = makePng(picture);
  for (const tests::PngChunk& chunk : tests::chunksOf(stream)) {
    if (chunk.name != "IDAT") continue;
    memset(&stream[chunk.offset + 100], 0xFF, 50);
    break;
  }
  const Call call = callFor("", [&] {
    return RasterChecked_ReadPngBuffer(stream.data(), stream.size(), 0, nullptr, &out.image,
                                       nullptr, 0);
  });
  EXPECT_EQ(runWith(call, -1, false), RASTER_STATUS_DAMAGED);
  EXPECT_EQ(blocks, 0);
  EXPECT_LT(most, 4 * kMebibyte);
}

/// A text chunk that unpacks to `size` bytes, put behind the header.
Bytes withLargeText(const Bytes& stream, size_t size) {
  tests::PngPicture carrier;
  carrier.width = 1000;
  carrier.height = static_cast<uint32>(size / 3001);
  carrier.rows.assign(size_t{3000} * carrier.height, 0);
  const Bytes packed = makePng(carrier);
  Bytes chunk = {0, 0, 0, 0, 'z', 'T', 'X', 't', 'k', 0, 0};
  for (const tests::PngChunk& c : tests::chunksOf(packed)) {
    if (c.name != "IDAT") continue;
    const auto from = packed.begin() + static_cast<ptrdiff_t>(c.offset);
    chunk.insert(chunk.end(), from, from + static_cast<ptrdiff_t>(c.length));
  }
  const auto length = static_cast<uint32>(chunk.size() - 8);
  for (int i = 0; i < 4; ++i)
    chunk[static_cast<size_t>(i)] = static_cast<uint8>(length >> (24 - 8 * i));
  chunk.resize(chunk.size() + 4);  // a wrong checksum, which only warns
  Bytes result = stream;
  result.insert(result.begin() + 33, chunk.begin(), chunk.end());
  return result;
}

TEST_F(RasterCheckedMemory, IsNotSpentOnTexts) {
  const Bytes stream = withLargeText(makePng(rgbPicture(4, 4)), 7000000);
  ASSERT_LT(stream.size(), 100000u);
  const Call call = callFor("", [&] {
    return RasterChecked_ReadPngBuffer(stream.data(), stream.size(), 0, nullptr, &out.image,
                                       nullptr, 0);
  });
  EXPECT_EQ(runWith(call, -1, false), RASTER_STATUS_OK);
  EXPECT_LT(most, kMebibyte);
}

TEST_F(RasterCheckedMemory, IsNotNeededForInformation) {
  const Bytes stream = makePng(rgbPicture(4, 4));
  RasterPngInfo info = {};
  EXPECT_EQ(runWith({"", [&] { return RasterChecked_PngInfo(stream.data(), stream.size(), &info); },
                     [] { return true; }, [] {}},
                    0, true),
            RASTER_STATUS_OK);
  const uint32 words[] = {8, 1, 32, 32, 3, 5, 5, 6};
  uint8 block[sizeof words];
  memcpy(block, words, sizeof words);
  RasterBlockInfo header = {};
  EXPECT_EQ(runWith({"", [&] { return RasterChecked_BlockInfo(block, 32, nullptr, &header); },
                     [] { return true; }, [] {}},
                    0, true),
            RASTER_STATUS_OK);
  EXPECT_EQ(refused, 0);
}

}  // namespace
