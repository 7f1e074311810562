// SPDX-License-Identifier: MIT
//
// Compression against memory limits and LZ4. LZ4 is another and stronger code; both sides allocate
// what they return, as the interface does.
//
// With RASTER_SCREENSHOTS set to a list of PNG files (separated by blanks) the program prints, in
// place of the usual jobs, ratio and speed on these, beside LZ4 and zlib level 1.

#include <png.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <sstream>
#include <vector>

#include "raster.h"
#include "support/jobs.h"

#ifdef HAVE_LZ4
#include <lz4.h>
#endif
#ifdef HAVE_ZLIB
#include <zlib.h>
#endif

namespace {

using bench::Contenders;
using bench::Extent;

using Pixels = std::vector<uint32>;

uint64 randomState = 1;
uint32 randomWord() {
  randomState = randomState * 6364136223846793005u + 1442695040888963407u;
  return static_cast<uint32>(randomState >> 32);
}

Pixels flatImage(Extent e) { return Pixels(size_t{e.width} * e.height, 0xFF336699); }

Pixels noiseImage(Extent e) {
  Pixels pixels(size_t{e.width} * e.height);
  for (uint32& pixel : pixels) pixel = randomWord();
  return pixels;
}

struct Box {
  uint32 left, top, right, bottom;
};

/// Draws over a box of the image: `colorAt` gives each pixel.
template <class ColorAt> void paint(Pixels& pixels, Extent e, Box box, ColorAt colorAt) {
  for (uint32 y = box.top; y < box.bottom && y < e.height; ++y) {
    for (uint32 x = box.left; x < box.right && x < e.width; ++x)
      pixels[size_t{y} * e.width + x] = colorAt(x, y);
  }
}

/// A screen: a plain background, windows with a frame and lines of text, and one photograph. It is
/// laid out for a frame; a smaller one is its top left corner.
Pixels desktopImage(Extent e) {
  Pixels pixels(size_t{e.width} * e.height, 0xFF3A6EA5);
  const Box windows[] = {{40, 40, 900, 620}, {700, 200, 1500, 900}, {200, 560, 1000, 1040}};
  for (const Box& w : windows) {
    paint(pixels, e, w, [](uint32, uint32) { return 0xFFFFFFFF; });
    paint(pixels, e, {w.left, w.top, w.right, w.top + 24},
          [](uint32, uint32) { return 0xFF20407F; });
    for (uint32 line = w.top + 36; line + 10 < w.bottom; line += 18) {
      const uint32 end = w.left + 20 + randomWord() % (w.right - w.left - 40);
      paint(pixels, e, {w.left + 12, line, end, line + 10}, [](uint32 x, uint32) {
        return x % 8 < 6 && randomWord() % 3 == 0 ? 0xFF000000 : 0xFFFFFFFF;
      });
    }
  }
  paint(pixels, e, {1540, 120, 1860, 360},
        [](uint32, uint32) { return randomWord() | 0xFF020202; });
  return pixels;
}

struct Block {
  uint8* bytes = nullptr;
  uint32 size = 0;
};

Block compressed(const Pixels& pixels, Extent e) {
  Block block;
  Raster_Compress(pixels.data(), 0, 32, e.width, e.height, &block.bytes, &block.size);
  return block;
}

void decompress(const uint8* block, uint8** data) {
  uint32 pitch, bpp, width, height;
  Raster_Decompress(block, data, &pitch, &bpp, &width, &height);
}

size_t bytesOf(const Pixels& pixels) { return pixels.size() * 4; }

/// Memory as the compressors return it: allocated, written by `write`, released.
template <class Write> void inFreshMemory(size_t bytes, Write write) {
  void* memory = malloc(bytes);
  if (memory == nullptr) abort();
  write(static_cast<char*>(memory));
  bench::used();
  free(memory);
}

/// What any encoder has to do: read all pixels once and write the code. No byte of the images that
/// shrink is 1, so the search reads them all.
void compressLimit(const Pixels& pixels, size_t codeBytes) {
  inFreshMemory(bytesOf(pixels) + 32, [&](char* to) {
    if (codeBytes < bytesOf(pixels))
      benchmark::DoNotOptimize(memchr(pixels.data(), 1, bytesOf(pixels)));
    memcpy(to, pixels.data(), std::min(codeBytes, bytesOf(pixels)));
  });
}

/// What any decoder has to do: read the code and write all pixels.
void decompressLimit(const Pixels& pixels, const Block& block) {
  inFreshMemory(bytesOf(pixels), [&](char* to) {
    const size_t head = std::min<size_t>(block.size, bytesOf(pixels));
    memcpy(to, block.bytes, head);
    memset(to + head, 1, bytesOf(pixels) - head);
  });
}

#ifdef HAVE_LZ4
const char* charsOf(const void* bytes) { return static_cast<const char*>(bytes); }

int lz4Bound(const Pixels& pixels) { return LZ4_compressBound(static_cast<int>(bytesOf(pixels))); }

int lz4Compress(const Pixels& pixels, char* to, int acceleration) {
  return LZ4_compress_fast(charsOf(pixels.data()), to, static_cast<int>(bytesOf(pixels)),
                           lz4Bound(pixels), acceleration);
}
#endif

void compressJob(const std::string& name, Pixels (*image)(Extent)) {
  bench::job("rle/compress-" + name, bench::kFileExtents, [=](Contenders& c, Extent e) {
    const Pixels pixels = image(e);
    const Block block = compressed(pixels, e);
    c.add("raster", [=] { free(compressed(pixels, e).bytes); });
    c.add("limit", [=] { compressLimit(pixels, block.size - 20); });
#ifdef HAVE_LZ4
    for (const int acceleration : {1, 8}) {
      c.add(acceleration == 1 ? "lz4" : "lz4 fast8", [=] {
        inFreshMemory(static_cast<size_t>(lz4Bound(pixels)),
                      [&](char* to) { lz4Compress(pixels, to, acceleration); });
      });
    }
#endif
  });
}

void decompressJob(const std::string& name, Pixels (*image)(Extent)) {
  bench::job("rle/decompress-" + name, bench::kFileExtents, [=](Contenders& c, Extent e) {
    const Pixels pixels = image(e);
    const Block block = compressed(pixels, e);
    c.add("raster", [=] {
      uint8* data = nullptr;
      decompress(block.bytes, &data);
      bench::used();
      free(data);
    });
    c.add("limit", [=] { decompressLimit(pixels, block); });
#ifdef HAVE_LZ4
    std::vector<char> code(static_cast<size_t>(lz4Bound(pixels)));
    const int size = lz4Compress(pixels, code.data(), 1);
    c.add("lz4", [=] {
      inFreshMemory(bytesOf(pixels), [&](char* to) {
        LZ4_decompress_safe(code.data(), to, size, static_cast<int>(bytesOf(pixels)));
      });
    });
#endif
  });
}

#if defined(HAVE_LZ4) && defined(HAVE_ZLIB)

/// The best time of several runs, in seconds.
template <class Work> double bestSeconds(Work work) {
  double best = 1e9;
  for (int run = 0; run < 15; ++run) {
    const auto start = std::chrono::steady_clock::now();
    work();
    const std::chrono::duration<double> took = std::chrono::steady_clock::now() - start;
    best = took.count() < best ? took.count() : best;
  }
  return best;
}

/// A line of the table: how much smaller, and pixels per second there and back.
void printLine(const std::string& file, const char* code, const Pixels& pixels, size_t size,
               double there, double back) {
  const double pixelCount = static_cast<double>(pixels.size());
  printf("%-28s %-12s %8.2f %10.0f %10.0f\n", file.c_str(), code,
         pixelCount * 4 / static_cast<double>(size), pixelCount / there / 1e6,
         pixelCount / back / 1e6);
}

void measureOurs(const std::string& file, const Pixels& pixels, Extent e) {
  const Block block = compressed(pixels, e);
  uint8* data = nullptr;
  if (block.size < bytesOf(pixels)) {
    decompress(block.bytes, &data);
    if (memcmp(data, pixels.data(), bytesOf(pixels)) != 0) abort();
    free(data);
    const double back = bestSeconds([&] {
      decompress(block.bytes, &data);
      free(data);
    });
    printLine(file, "raster", pixels, block.size,
              bestSeconds([&] { free(compressed(pixels, e).bytes); }), back);
  } else {
    printf("%-28s %-12s stored\n", file.c_str(), "raster");
  }
  free(block.bytes);
}

void measureLz4(const std::string& file, const Pixels& pixels) {
  std::vector<char> code(static_cast<size_t>(lz4Bound(pixels)));
  Pixels data(pixels.size());
  int size = 0;
  const double there = bestSeconds([&] { size = lz4Compress(pixels, code.data(), 1); });
  const double back = bestSeconds([&] {
    LZ4_decompress_safe(code.data(), static_cast<char*>(static_cast<void*>(data.data())), size,
                        static_cast<int>(bytesOf(data)));
  });
  printLine(file, "lz4", pixels, static_cast<size_t>(size), there, back);
}

void measureZlib(const std::string& file, const Pixels& pixels) {
  const auto* bytes = static_cast<const Bytef*>(static_cast<const void*>(pixels.data()));
  std::vector<Bytef> code(compressBound(bytesOf(pixels)));
  std::vector<Bytef> data(bytesOf(pixels));
  uLongf size = 0;
  const double there = bestSeconds([&] {
    size = code.size();
    compress2(code.data(), &size, bytes, bytesOf(pixels), 1);
  });
  const double back = bestSeconds([&] {
    uLongf length = data.size();
    uncompress(data.data(), &length, code.data(), size);
  });
  printLine(file, "zlib level 1", pixels, size, there, back);
}

int measureScreenshots(const char* files) {
  printf("%-28s %-12s %8s %10s %10s\n", "screenshot", "code", "ratio", "Mpx/s", "and back");
  std::istringstream list(files);
  for (std::string file; list >> file;) {
    png_image image = {};
    image.version = PNG_IMAGE_VERSION;
    if (png_image_begin_read_from_file(&image, file.c_str()) == 0) {
      fprintf(stderr, "%s: %s\n", file.c_str(), image.message);
      return 1;
    }
    image.format = PNG_FORMAT_BGRA;
    Pixels pixels(size_t{image.width} * image.height);
    png_image_finish_read(&image, nullptr, pixels.data(), 0, nullptr);
    const std::string name = file.substr(file.rfind('/') + 1);
    measureOurs(name, pixels, {image.width, image.height});
    measureLz4(name, pixels);
    measureZlib(name, pixels);
  }
  return 0;
}

#else

int measureScreenshots(const char* /*files*/) {
  fprintf(stderr, "built without LZ4 or zlib\n");
  return 1;
}

#endif

}  // namespace

int main(int argc, char** argv) {
  const char* files = getenv("RASTER_SCREENSHOTS");
  if (files != nullptr) return measureScreenshots(files);
  compressJob("flat", flatImage);
  decompressJob("flat", flatImage);
  compressJob("desktop", desktopImage);
  decompressJob("desktop", desktopImage);
  compressJob("noise", noiseImage);
  return bench::run(argc, argv);
}
