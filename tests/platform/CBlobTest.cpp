#include "CBlob.h"

#include <gtest/gtest.h>

#include <string>

namespace {

std::string contents(CBlob const& blob) {
  return std::string(reinterpret_cast<char const*>(blob.GetData()), blob.GetSize());
}

unsigned char const* bytes(char const* text) {
  return reinterpret_cast<unsigned char const*>(text);
}

TEST(CBlob, InsertPlacesBytesAtThePositionAndReturnsTheNewSize) {
  CBlob blob;
  EXPECT_EQ(3, blob.Insert(0, bytes("ace"), 3));
  EXPECT_EQ(4, blob.Insert(1, bytes("b"), 1));
  EXPECT_EQ(5, blob.Insert(3, bytes("d"), 1));
  EXPECT_EQ(6, blob.Insert(5, bytes("\0"), 1));
  EXPECT_EQ(std::string("abcde\0", 6), contents(blob));
}

TEST(CBlob, RejectedInsertsLeaveTheBufferUnchanged) {
  CBlob blob;
  blob.Insert(0, bytes("ab"), 2);
  EXPECT_LT(blob.Insert(3, bytes("x"), 1), 0);
  EXPECT_LT(blob.Insert(0, nullptr, 1), 0);
  EXPECT_LT(blob.Insert(0, bytes("x"), 0xFFFFFFFFu), 0);
  EXPECT_EQ("ab", contents(blob));
}

}  // namespace
