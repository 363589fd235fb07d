// Texts of several pieces that may be longer than there is room for.
#include "PlexorProviderIfcProperty.h"
#include "render_recorder.h"

namespace plexortest {
namespace {

TEST(BoundedTextTest, TakesPieceAfterPiece) {
    BoundedText<8> text;
    EXPECT_STREQ(text.Text(), "");
    text.Append("%s", "ab");
    text.Append("-%d", 12);
    EXPECT_STREQ(text.Text(), "ab-12");
}

TEST(BoundedTextTest, IsFilledToTheLastCharacter) {
    BoundedText<8> text;
    text.Append("%s", "abcdef");
    text.Append("%s", "g");
    EXPECT_STREQ(text.Text(), "abcdefg");
}

TEST(BoundedTextTest, WhatHasBeenCutStaysAsItIs) {
    for (const char* piece : {"abcdefg", "abcdefgh", "abcdefghijklm"}) {
        BoundedText<8> text;
        text.Append("%s", piece);
        text.Append("%s", "xyz");
        text.Append("%s", "");
        EXPECT_STREQ(text.Text(), "abcdefg") << piece;
    }
}

}  // namespace
}  // namespace plexortest
