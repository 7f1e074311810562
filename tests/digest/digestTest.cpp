// SPDX-License-Identifier: MIT
//
// One number for everything: the digest of a fixed run over all functions is the same at every
// instruction-set level, on both word sizes, with every compiler and at every level of
// optimisation.
//
// Where it differs, RASTER_DIGEST_CASES=N tells the digest of the first N cases, to be compared.

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "digest/apiDigest.h"

namespace {

using tests::digestOfCases;
using tests::Sha256;

constexpr int kCases = 200000;
constexpr char kDigest[] = "7418b4258beb5a56658c1ba5d7cc2ad155f535e3a8ee32b6724d3b0de4d06435";

std::string sha256Of(const std::string& text) {
  Sha256 hash;
  hash.add(text.data(), text.size());
  return hash.finish();
}

// The vectors of FIPS 180-4.
TEST(Sha256, GivesTheKnownDigests) {
  EXPECT_EQ(sha256Of(""), "e3b0c44298fc1c149afbf4c8996fb92427ae41e4649b934ca495991b7852b855");
  EXPECT_EQ(sha256Of("abc"), "ba7816bf8f01cfea414140de5dae2223b00361a396177a9cb410ff61f20015ad");
  EXPECT_EQ(sha256Of("abcdbcdecdefdefgefghfghighijhijkijkljklmklmnlmnomnopnopq"),
            "248d6a61d20638b8e5c026930c3e6039a33ce45964ff2167f6ecedd419db06c1");
  EXPECT_EQ(sha256Of(std::string(1000000, 'a')),
            "cdc76e5c9914fb9281a1c7e284d73e67f1809a48a497200e046d39ccc7112cd0");
}

TEST(Digest, IsTheOneInTheTree) {
  const char* cases = getenv("RASTER_DIGEST_CASES");
  if (cases != nullptr) GTEST_SKIP() << digestOfCases(atoi(cases), &rasterops_mmx);
  EXPECT_EQ(digestOfCases(kCases, &rasterops_mmx), kDigest);
}

}  // namespace
