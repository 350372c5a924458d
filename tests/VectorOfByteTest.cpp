#include "Support.h"

#include <utils/VectorOfByte.h>

using namespace mirel;

namespace {

/// Expects that an edit of b leaves these bytes.
#define EXPECT_BYTES(EDIT, ...)                                                                              \
  EDIT;                                                                                                      \
  EXPECT_EQ(b, (VectorOfByte{__VA_ARGS__})) << "after " << #EDIT

TEST(VectorOfByteTest, EditsAtAnyPlace) {
  VectorOfByte b;
  b.insertbytes(0, 2);
  b[0] = 1;
  EXPECT_BYTES(b[1] = 2, 1, 2);
  EXPECT_BYTES(b.insert(1, 3), 1, 3, 2);
  EXPECT_BYTES(b.insert(0, 2, 9), 9, 9, 1, 3, 2);
  EXPECT_BYTES(b.insert(b.end(), 7), 9, 9, 1, 3, 2, 7);
  EXPECT_BYTES(b.push_back(uint8(8)), 9, 9, 1, 3, 2, 7, 8);
  EXPECT_BYTES(b.push_back(b.begin(), b.end()), 9, 9, 1, 3, 2, 7, 8, 9, 9, 1, 3, 2, 7, 8);
  EXPECT_BYTES(b.erase(0, 8), 9, 1, 3, 2, 7, 8);
  EXPECT_BYTES(b.move(0, 1, 3), 1, 3, 2, 2, 7, 8);
  EXPECT_BYTES(b.erase(b.begin() + 4, b.end()), 1, 3, 2, 2);
  EXPECT_BYTES(b.erase_element(0), 3, 2, 2);
  EXPECT_EQ(*b.insert(b.begin() + 1, 5), 5);
  EXPECT_BYTES(EXPECT_EQ(*b.erase(b.begin()), 5), 5, 2, 2);
  EXPECT_BYTES(b.insert(1, b.begin(), b.end()), 5, 5, 2, 2, 2, 2);
  EXPECT_BYTES(b.assign(b.begin() + 1, b.begin() + 3), 5, 2);
  EXPECT_BYTES(b += b, 5, 2, 5, 2);
  EXPECT_BYTES(b.insert(b.begin(), 2, b.front()), 5, 5, 5, 2, 5, 2);
  EXPECT_BYTES(b.assign(b.begin() + 2, b.begin() + 4), 5, 2);
  EXPECT_BYTES(b.insert(0, b.data(), b.data_end()), 5, 2, 5, 2);
  EXPECT_BYTES(b.insert(b.begin() + 1, b.begin(), b.end()), 5, 5, 2, 5, 2, 2, 5, 2);
  EXPECT_BYTES(b.insert(b.end(), ssize_t(2), b.back()), 5, 5, 2, 5, 2, 2, 5, 2, 2, 2);
  EXPECT_BYTES(b.push_back<unsigned short>(0x0303), 5, 5, 2, 5, 2, 2, 5, 2, 2, 2, 3, 3);
}

TEST(VectorOfByteTest, KnowsItsBytesAndOwnsItsWholeCapacity) {
  VectorOfByte b{1, 2, 3};
  const VectorOfByte c(b);
  EXPECT_EQ(c.size(), 3);
  EXPECT_EQ(c.front(), 1);
  EXPECT_EQ(c[1], 2);
  EXPECT_EQ(c.back(), 3);
  EXPECT_EQ(c.data_end() - c.data(), 3);
  b.reserve(40);
  EXPECT_EQ(b.capacity(), 40);
  EXPECT_TRUE(b.owns(b.data()));
  EXPECT_TRUE(b.owns(b.data() + 39));
  EXPECT_FALSE(b.owns(b.data() + 40));
  EXPECT_FALSE(b.owns(&b));
  EXPECT_FALSE(VectorOfByte().owns(nullptr));
}

TEST(VectorOfByteTest, AppendsWhereThereIsRoomAndCopiesToItsSize) {
  const VectorOfByte tail{3, 4};
  VectorOfByte b{1, 2};
  b.reserve(9);
  EXPECT_BYTES(b += tail, 1, 2, 3, 4);
  EXPECT_BYTES(b.push_back(tail.begin(), tail.end()), 1, 2, 3, 4, 3, 4);
  EXPECT_EQ(VectorOfByte(b).capacity(), 6);
  const auto* const data = b.data();
  b = *&b;
  EXPECT_EQ(b.data(), data);
  VectorOfByte full{1, 2};
  const auto where = full.insert(full.begin() + 1, 7);
  EXPECT_EQ(where, full.begin() + 1) << "after growth, which moves the storage";
}

TEST(VectorOfByteTest, ComparesBytes) {
  const VectorOfByte a{1, 2}, b{1, 200}, c;
  EXPECT_LT(a, b);
  EXPECT_LE(a, b);
  EXPECT_LE(a, a);
  EXPECT_GT(b, a);
  EXPECT_GE(b, a);
  EXPECT_GE(a, a);
  EXPECT_NE(a, b);
  EXPECT_FALSE(a == b);
  EXPECT_LT(c, a);
  EXPECT_NE(VectorOfByte(c), a);
  EXPECT_EQ(a.compare(0, 1, b, 0, 1), 0);
  EXPECT_LT(a.compare(1, 1, b, 1, 1), 0);
  EXPECT_EQ(a.compare(0, 1, b), -1);
  EXPECT_EQ(a.compare(1, 0, c), 0);
  EXPECT_EQ(a.compare(2, 0, nullptr, 0), 0);
  EXPECT_EQ(a.compare(0, 1, b.data(), 1), 0);
  EXPECT_EQ(a.compare(0, 1, b.data(), 2), -1);
  EXPECT_EQ(a.compare(0, 2, b.data(), 1), 1);
  EXPECT_EQ(VectorOfByte(3, 7), (VectorOfByte{7, 7, 7}));
  VectorOfByte d(a.begin(), a.end());
  EXPECT_EQ(d, a);
  d = b;
  EXPECT_EQ(d, b);
  d = c;
  EXPECT_EQ(d, VectorOfByte(c));
  VectorOfByte().swap(d);
  EXPECT_TRUE(d.empty());
  EXPECT_EQ(d.data(), nullptr);
}

} // namespace
