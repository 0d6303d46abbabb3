#include "UUID.h"

#include <gtest/gtest.h>

namespace {

TEST(UUID, BytesFollowTheGuidLayout) {
  UUID const id("192df9cc-169c-4a4e-9476-0f540f99c22c", "example");
  static unsigned char const kExpected[16] = {0xcc, 0xf9, 0x2d, 0x19, 0x9c, 0x16, 0x4e, 0x4a,
                                              0x94, 0x76, 0x0f, 0x54, 0x0f, 0x99, 0xc2, 0x2c};
  for (size_t i = 0; i < 16; ++i)
    EXPECT_EQ(id.bytes()[i], kExpected[i]) << "byte " << i;
}

TEST(UUID, NameIsAttachedButIdentityIsTheBytesInAnyCase) {
  UUID const first("192df9cc-169c-4a4e-9476-0f540f99c22c", "first");
  EXPECT_STREQ(first.name(), "first");
  EXPECT_EQ(first, UUID("192DF9CC-169C-4A4E-9476-0F540F99C22C", "second"));
  EXPECT_NE(first, UUID("192df9cc-169c-4a4e-9476-0f540f99c22d", "first"));
}

TEST(UUID, MalformedTextGivesNil) {
  for (char const* text : {"", "192df9cc-169c-4a4e-9476-0f540f99c22", "192df9cc-169c-4a4e-9476-0f540f99c22cc",
                           "192df9cc1169c-4a4e-9476-0f540f99c22c", "192df9cc-169c-4a4e-9476-0f540f99c22g",
                           "{92df9cc-169c-4a4e-9476-0f540f99c22c"})
    EXPECT_TRUE(UUID(text, "bad").isNil()) << text;
  EXPECT_TRUE(UUID(nullptr, "bad").isNil());
  EXPECT_EQ(UUID("", "bad"), UUID());
}

}  // namespace
