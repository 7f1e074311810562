// SPDX-License-Identifier: MIT
//
// SHA-256 (FIPS 180-4), so that a test needs no library of both word sizes for one number.

#ifndef TESTS_SHA256_H
#define TESTS_SHA256_H

#include <bit>
#include <cstdio>
#include <cstring>
#include <string>

#include "baseTypes.h"

namespace tests {

class Sha256 {
 public:
  void add(const void* data, size_t size) {
    const auto* bytes = static_cast<const uint8*>(data);
    total_ += size;
    for (size_t i = 0; i < size; ++i) {
      block_[used_++] = bytes[i];
      if (used_ == sizeof block_) mix();
    }
  }

  /// The digest in hexadecimal digits. Nothing can be added afterwards.
  std::string finish() {
    const uint64 bits = 8 * total_;
    const uint8 end = 0x80;
    const uint8 zero = 0;
    add(&end, 1);
    while (used_ != 56) add(&zero, 1);
    for (int i = 7; i >= 0; --i) {
      const auto byte = static_cast<uint8>(bits >> (8 * i));
      add(&byte, 1);
    }
    std::string text;
    for (const uint32 word : state_) {
      char digits[9];
      snprintf(digits, sizeof digits, "%08x", word);
      text += digits;
    }
    return text;
  }

 private:
  static constexpr uint32 kRound[64] = {
      0x428a2f98, 0x71374491, 0xb5c0fbcf, 0xe9b5dba5, 0x3956c25b, 0x59f111f1, 0x923f82a4,
      0xab1c5ed5, 0xd807aa98, 0x12835b01, 0x243185be, 0x550c7dc3, 0x72be5d74, 0x80deb1fe,
      0x9bdc06a7, 0xc19bf174, 0xe49b69c1, 0xefbe4786, 0x0fc19dc6, 0x240ca1cc, 0x2de92c6f,
      0x4a7484aa, 0x5cb0a9dc, 0x76f988da, 0x983e5152, 0xa831c66d, 0xb00327c8, 0xbf597fc7,
      0xc6e00bf3, 0xd5a79147, 0x06ca6351, 0x14292967, 0x27b70a85, 0x2e1b2138, 0x4d2c6dfc,
      0x53380d13, 0x650a7354, 0x766a0abb, 0x81c2c92e, 0x92722c85, 0xa2bfe8a1, 0xa81a664b,
      0xc24b8b70, 0xc76c51a3, 0xd192e819, 0xd6990624, 0xf40e3585, 0x106aa070, 0x19a4c116,
      0x1e376c08, 0x2748774c, 0x34b0bcb5, 0x391c0cb3, 0x4ed8aa4a, 0x5b9cca4f, 0x682e6ff3,
      0x748f82ee, 0x78a5636f, 0x84c87814, 0x8cc70208, 0x90befffa, 0xa4506ceb, 0xbef9a3f7,
      0xc67178f2};

  void mix() {
    uint32 w[64];
    for (int i = 0; i < 16; ++i)
      w[i] = uint32{block_[4 * i]} << 24 | uint32{block_[4 * i + 1]} << 16 |
             uint32{block_[4 * i + 2]} << 8 | block_[4 * i + 3];
    for (int i = 16; i < 64; ++i) {
      const uint32 s0 = std::rotr(w[i - 15], 7) ^ std::rotr(w[i - 15], 18) ^ w[i - 15] >> 3;
      const uint32 s1 = std::rotr(w[i - 2], 17) ^ std::rotr(w[i - 2], 19) ^ w[i - 2] >> 10;
      w[i] = w[i - 16] + s0 + w[i - 7] + s1;
    }
    uint32 v[8];
    memcpy(v, state_, sizeof v);
    for (int i = 0; i < 64; ++i) {
      const uint32 s1 = std::rotr(v[4], 6) ^ std::rotr(v[4], 11) ^ std::rotr(v[4], 25);
      const uint32 t1 = v[7] + s1 + ((v[4] & v[5]) ^ (~v[4] & v[6])) + kRound[i] + w[i];
      const uint32 s0 = std::rotr(v[0], 2) ^ std::rotr(v[0], 13) ^ std::rotr(v[0], 22);
      const uint32 t2 = s0 + ((v[0] & v[1]) ^ (v[0] & v[2]) ^ (v[1] & v[2]));
      for (int j = 7; j > 0; --j) v[j] = v[j - 1];
      v[4] += t1;
      v[0] = t1 + t2;
    }
    for (int i = 0; i < 8; ++i) state_[i] += v[i];
    used_ = 0;
  }

  uint32 state_[8] = {0x6a09e667, 0xbb67ae85, 0x3c6ef372, 0xa54ff53a,
                      0x510e527f, 0x9b05688c, 0x1f83d9ab, 0x5be0cd19};
  uint8 block_[64] = {};
  size_t used_ = 0;
  uint64 total_ = 0;
};

}  // namespace tests

#endif
