// SPDX-License-Identifier: MIT
//
// Recordings: what was written is played; what is broken off or damaged is noticed before it is
// drawn.

#include "recording.h"

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "support/guardedBuffer.h"
#include "support/random.h"

namespace tool::live {
namespace {

using tests::GuardedBuffer;
using tests::Random;

constexpr uint32 kWidth = 60;
constexpr uint32 kHeight = 40;

std::vector<uint8> asVector(const Bytes& bytes) {
  return {bytes.data(), bytes.data() + bytes.size()};
}

/// Some updates of a picture, where each ends in the file, and what the picture then was.
struct Sample {
  std::vector<uint8> file;
  std::vector<size_t> ends;
  std::vector<std::vector<uint8>> pictures;
};

/// Half of it in runs of one colour, so that blocks of both kinds occur.
void repaint(Random& random, std::vector<uint8>& picture, const Rect& rect) {
  const uint32 color = random.word() & 0xFFFFFF;
  const bool isPlain = random.below(2) == 0;
  for (int32 y = rect.top; y < rect.bottom; ++y) {
    for (int32 x = rect.left; x < rect.right; ++x) {
      const uint32 pixel = isPlain ? color : random.word() & 0xFFFFFF;
      memcpy(picture.data() + 4 * (static_cast<size_t>(y) * kWidth + static_cast<size_t>(x)),
             &pixel, sizeof pixel);
    }
  }
}

Sample makeSample() {
  Random random(1);
  Sample sample;
  Bytes out;
  RecordingWriter writer;
  RecordingWriter::putHeader(kWidth, kHeight, out);
  std::vector<uint8> picture(kWidth * kHeight * 4);
  for (uint32 i = 0; i < 8; ++i) {
    std::vector<Rect> rects;
    for (uint32 j = 0; j < 3; ++j) {
      const int32 x = random.between(0, kWidth - 1);
      const int32 y = random.between(0, kHeight - 1);
      rects.push_back({x, y, random.between(x + 1, kWidth), random.between(y + 1, kHeight)});
      repaint(random, picture, rects.back());
    }
    std::vector<uint8> withTopBytes = picture;
    for (size_t top = 3; top < withTopBytes.size(); top += 4)
      withTopBytes[top] = static_cast<uint8>(random.word());
    const PixelView view = {withTopBytes.data(), 4 * kWidth, kWidth, kHeight};
    writer.putUpdate(uint64{1000000} * i, view, rects, out);
    sample.ends.push_back(out.size());
    sample.pictures.push_back(picture);
  }
  sample.file = asVector(out);
  return sample;
}

std::vector<uint8> pictureOf(const RecordingReader& reader) {
  const PixelView view = reader.picture();
  return {view.data, view.data + size_t{view.pitch} * view.height};
}

/// Plays it all and returns how many updates there were.
size_t play(RecordingReader& reader) {
  size_t count = 0;
  for (; reader.nextTime(); ++count) reader.drawNext();
  return count;
}

TEST(Recording, PlaysWhatWasWritten) {
  const Sample sample = makeSample();
  RecordingReader reader(sample.file.data(), sample.file.size());
  for (size_t i = 0; i < sample.pictures.size(); ++i) {
    ASSERT_EQ(reader.nextTime(), uint64{1000000} * i);
    ASSERT_EQ(reader.nextTime(), uint64{1000000} * i);
    reader.drawNext();
    EXPECT_EQ(pictureOf(reader), sample.pictures[i]);
    EXPECT_EQ(reader.position(), sample.ends[i]);
  }
  EXPECT_FALSE(reader.nextTime());
  EXPECT_TRUE(reader.isAtEnd());
  EXPECT_EQ(reader.fault(), "");
}

TEST(Recording, PlaysUpToTheLastWholeUpdate) {
  const Sample sample = makeSample();
  for (size_t size = 20; size < sample.file.size(); ++size) {
    GuardedBuffer file(size);
    memcpy(file.data(), sample.file.data(), size);
    RecordingReader reader(file.data(), size);
    const size_t count = play(reader);
    size_t whole = 0;
    while (whole < sample.ends.size() && sample.ends[whole] <= size) ++whole;
    ASSERT_EQ(count, whole);
    ASSERT_TRUE(whole == 0 || pictureOf(reader) == sample.pictures[whole - 1]);
    const bool isWhole = size == 20 || (whole != 0 && sample.ends[whole - 1] == size);
    ASSERT_EQ(reader.isAtEnd(), isWhole);
    ASSERT_EQ(reader.isBrokenOff(), !isWhole);
  }
}

TEST(Recording, RefusesWhatIsNone) {
  const std::vector<uint8> file = makeSample().file;
  const auto faultOf = [](const std::vector<uint8>& bytes) {
    RecordingReader reader(bytes.data(), bytes.size());
    EXPECT_FALSE(reader.nextTime());
    return reader.fault();
  };
  EXPECT_EQ(faultOf({}), "it is not a recording");
  EXPECT_EQ(faultOf({file.begin(), file.begin() + 19}), "it is not a recording");
  std::vector<uint8> changed = file;
  changed[0] ^= 1;
  EXPECT_EQ(faultOf(changed), "it is not a recording");
  changed = file;
  changed[8] = 2;
  EXPECT_EQ(faultOf(changed), "it is of version 2");
  changed = file;
  changed[12] = changed[13] = 0;
  EXPECT_EQ(faultOf(changed), "it has no pixels, or too many");
}

TEST(Recording, FollowsANewSize) {
  Bytes out;
  RecordingWriter::putHeader(kWidth, kHeight, out);
  RecordingWriter::putSize(5, 7, 9, out);
  RecordingReader reader(out.data(), out.size());
  ASSERT_EQ(reader.nextTime(), 5u);
  reader.drawNext();
  EXPECT_EQ(reader.picture().width, 7u);
  EXPECT_EQ(reader.picture().height, 9u);
  EXPECT_EQ(pictureOf(reader), std::vector<uint8>(7 * 9 * 4));
}

TEST(Recording, SurvivesDamage) {
  const Sample sample = makeSample();
  Random random(3);
  for (int round = 0; round < tests::rounds(3000); ++round) {
    GuardedBuffer file(sample.file.size());
    file.assign(sample.file);
    for (uint32 i = 1 + random.below(3); i != 0; --i) {
      // Mostly within headers, where it matters.
      const size_t near = random.below(3) == 0 ? random.below(static_cast<uint32>(file.size()))
                                               : sample.ends[random.below(7)] + random.below(60);
      file.data()[near] = static_cast<uint8>(random.word());
    }
    RecordingReader reader(file.data(), file.size());
    play(reader);
    EXPECT_TRUE(reader.isAtEnd() || !reader.fault().empty());
  }
}

}  // namespace
}  // namespace tool::live
