// The inverse transforms against plain scalar formulas, on real, sparse and hostile coefficients.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <random>

#include "codec/formats/jpeg/decoder/decoder_abi.h"
#include "codec/formats/jpeg/tables.h"

namespace {

using Block = std::array<int32_t, 64>;
using Samples = std::array<uint8_t, 64>;
using Member = decltype(&PELOJ_DoIdct);

Block multipliers(int step) {
  Block m;
  for (size_t i = 0; i < 64; ++i) m[i] = step * pelo::jpeg::kAanScale[i] >> 2;
  return m;
}

Samples run(Member transform, const Block& m, const Block& block) {
  Samples out{};
  uint8_t* rows[8];
  for (size_t r = 0; r < 8; ++r) rows[r] = out.data() + 8 * r;
  transform(nullptr, m.data(), block.data(), rows, 0);
  return out;
}

int32_t mul(int64_t a, int64_t k) {
  return static_cast<int32_t>(a * k >> 8);
}

// One dimension, in the order in which the published algorithm lists its steps.
void reference_1d(std::array<int32_t, 8>& x) {
  const int32_t t10 = x[0] + x[4], t11 = x[0] - x[4], t13 = x[2] + x[6];
  const int32_t t12 = mul(x[2] - x[6], 362) - t13;
  const int32_t e0 = t10 + t13, e3 = t10 - t13, e1 = t11 + t12, e2 = t11 - t12;
  const int32_t z13 = x[5] + x[3], z10 = x[5] - x[3], z11 = x[1] + x[7], z12 = x[1] - x[7];
  const int32_t o7 = z11 + z13, z5 = mul(z10 + z12, 473);
  const int32_t o6 = mul(z10, -669) + z5 - o7, o5 = mul(z11 - z13, 362) - o6;
  const int32_t o4 = mul(z12, 277) - z5 + o5;
  x = {e0 + o7, e1 + o6, e2 + o5, e3 - o4, e3 + o4, e2 - o5, e1 - o6, e0 - o7};
}

Samples reference_8x8(const Block& m, const Block& block) {
  std::array<std::array<int32_t, 8>, 8> column{};
  for (size_t c = 0; c < 8; ++c) {
    for (size_t r = 0; r < 8; ++r) {
      const int64_t value = int64_t{block[8 * r + c]} * m[8 * r + c] >> 10;
      column[c][r] = static_cast<int32_t>(std::clamp<int64_t>(value, -65536, 65535));
    }
    reference_1d(column[c]);
  }
  Samples out{};
  for (size_t r = 0; r < 8; ++r) {
    std::array<int32_t, 8> row;
    for (size_t c = 0; c < 8; ++c) row[c] = column[c][r];
    reference_1d(row);
    for (size_t c = 0; c < 8; ++c)
      out[8 * r + c] = static_cast<uint8_t>(std::clamp((row[c] >> 5) + 128, 0, 255));
  }
  return out;
}

// Random coefficients in the first size x size.
Block random_block(std::mt19937& random, int size, int range) {
  Block block{};
  std::uniform_int_distribution<int32_t> value(-range, range);
  for (int r = 0; r < size; ++r) {
    for (int c = 0; c < size; ++c) block[static_cast<size_t>(8 * r + c)] = value(random) / (1 + r + c);
  }
  return block;
}

TEST(Idct, WholeTransformsEqualTheFormulas) {
  std::mt19937 random(1);
  for (int i = 0; i < 3000; ++i) {
    // The last ranges leave 16 and 32 bits: they must saturate, not wrap.
    const int range = i % 3 == 0 ? 60 : i % 3 == 1 ? 2000 : 2000000000;
    const Block m = multipliers(i % 256);
    const Block block = random_block(random, 8, range);
    const Samples expected = reference_8x8(m, block);
    ASSERT_EQ(expected, run(PELOJ_DoIdct8By8, m, block));
    ASSERT_EQ(expected, run(PELOJ_DoIdct, m, block));
    const Block corner = random_block(random, 4, range);
    ASSERT_EQ(reference_8x8(m, corner), run(PELOJ_DoIdct4By4, m, corner));
  }
}

// Folded constants round differently by at most one, and coefficients outside the square are not read.
TEST(Idct, SparseMembersFollowTheWholeOne) {
  struct {
    Member member;
    int rows, columns;
  } const members[] = {{PELOJ_DoIdct3By3, 3, 3}, {PELOJ_DoIdct2By2All, 2, 2}, {PELOJ_DoIdct2By2, 2, 2},
                       {PELOJ_DoIdct2By1, 1, 2}, {PELOJ_DoIdct1By2, 2, 1},    {PELOJ_DoIdct1By1, 1, 1}};
  std::mt19937 random(2);
  const Block m = multipliers(3);
  for (int i = 0; i < 500; ++i) {
    const Block full = random_block(random, 8, 200);
    for (const auto& [member, rows, columns] : members) {
      Block inside{};
      for (int r = 0; r < rows; ++r) {
        for (int c = 0; c < columns; ++c)
          inside[static_cast<size_t>(8 * r + c)] = full[static_cast<size_t>(8 * r + c)];
      }
      const Samples expected = reference_8x8(m, inside);
      const Samples actual = run(member, m, full);
      for (size_t k = 0; k < 64; ++k) ASSERT_NEAR(expected[k], actual[k], 1);
    }
  }
}

// A flat block is flat in every member, at every level.
TEST(Idct, FlatBlocks) {
  const Block m = multipliers(16);
  for (const int32_t dc : {0, 5, -5, 63, -64, 32767, -32767}) {
    Block block{};
    block[0] = dc;
    const uint8_t level = pelo::jpeg::idct_dc(m[0], dc);
    for (const auto member : {PELOJ_DoIdct8By8, PELOJ_DoIdct4By4, PELOJ_DoIdct3By3, PELOJ_DoIdct2By2,
                              PELOJ_DoIdct2By1, PELOJ_DoIdct1By1}) {
      Samples flat;
      flat.fill(level);
      EXPECT_EQ(flat, run(member, m, block)) << dc;
    }
    struct {
      Member member;
      int size;
    } const reduced[] = {{PELOJ_DoIdct4x4For4x4, 4}, {PELOJ_DoIdct3x3For4x4, 4},
                         {PELOJ_DoIdct2x2For4x4, 4}, {PELOJ_DoIdct2x1For4x4, 4},
                         {PELOJ_DoIdct1x1For4x4, 4}, {PELOJ_DoIdct_2to1, 4},
                         {PELOJ_DoIdct_8to3, 3},     {PELOJ_DoIdct_4to1, 2}};
    for (const auto& [member, size] : reduced) {
      const Samples out = run(member, m, block);
      for (int i = 0; i < size * size; ++i)
        ASSERT_EQ(level, out[static_cast<size_t>(8 * (i / size) + i % size)]);
    }
  }
}

// Reduced members are picks and means of the whole transform of the coefficients they read.
TEST(Idct, ReducedMembersSummariseTheWholeOne) {
  std::mt19937 random(3);
  const Block m = multipliers(4);
  for (int i = 0; i < 500; ++i) {
    const Block block = random_block(random, 4, 150);
    const Samples half = run(PELOJ_DoIdct_2to1, m, block);
    const Samples whole = reference_8x8(m, block);
    for (size_t x = 0; x < 4; ++x) {
      // Row 0 keeps y0 of the columns.
      ASSERT_EQ((whole[2 * x] + whole[2 * x + 1]) >> 1, half[x]);
    }
  }
}

// The 4-point transform as a matrix with one rounded product per factor.
TEST(Idct, FourPointMembersEqualTheFormulas) {
  std::mt19937 random(4);
  const auto four = [](std::array<int32_t, 4> x) {
    const int32_t t1 = mul(x[1], 106), t3 = mul(x[3], 106);
    return std::array<int32_t, 4>{x[0] + x[1] + x[2] + t3, x[0] + t1 - x[2] - x[3],
                                  x[0] - t1 - x[2] + x[3], x[0] - x[1] + x[2] - t3};
  };
  for (int i = 0; i < 300; ++i) {
    Block m;
    for (size_t k = 0; k < 64; ++k) m[k] = (1 + i % 20) * pelo::jpeg::kFourPointScale[k] >> 2;
    const Block block = random_block(random, 4, 100);
    std::array<std::array<int32_t, 4>, 4> column{};
    for (size_t c = 0; c < 4; ++c) {
      for (size_t r = 0; r < 4; ++r) column[c][r] = block[8 * r + c] * m[8 * r + c] >> 10;
      column[c] = four(column[c]);
    }
    const Samples out = run(PELOJ_DoIdct4x4For4x4, m, block);
    for (size_t r = 0; r < 4; ++r) {
      const auto row = four({column[0][r], column[1][r], column[2][r], column[3][r]});
      for (size_t c = 0; c < 4; ++c) ASSERT_EQ(std::clamp((row[c] >> 5) + 128, 0, 255), out[8 * r + c]);
    }
  }
}

}  // namespace
