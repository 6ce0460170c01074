#include <gtest/gtest.h>

#include <string>

#include "jni/JniCall.h"

namespace {

using orzavs::jni::decodeUtf8;
using orzavs::jni::isModifiedUtf8;
using orzavs::jni::javaSafeText;
using orzavs::jni::toModifiedUtf8;

TEST(JavaText, ModifiedUtf8IsRecognised) {
  EXPECT_TRUE(isModifiedUtf8(""));
  EXPECT_TRUE(isModifiedUtf8("plain ascii"));
  EXPECT_TRUE(isModifiedUtf8("caf\xC3\xA9 \xE2\x82\xAC"));           // 2- and 3-byte forms
  EXPECT_TRUE(isModifiedUtf8(std::string("a\xC0\x80" "b")));         // U+0000 as C0 80
  EXPECT_TRUE(isModifiedUtf8("\xED\xA0\xBD\xED\xB8\x80"));           // a surrogate pair
  EXPECT_FALSE(isModifiedUtf8(std::string("a\0b", 3)));              // raw NUL
  EXPECT_FALSE(isModifiedUtf8("\xF0\x9F\x98\x80"));                  // standard 4-byte form
  EXPECT_FALSE(isModifiedUtf8("\xC3"));                              // truncated
  EXPECT_FALSE(isModifiedUtf8("\x80"));                              // stray continuation
  EXPECT_FALSE(isModifiedUtf8("\xC1\x81"));                          // overlong
  EXPECT_FALSE(isModifiedUtf8("\xE0\x80\x80"));                      // overlong
  EXPECT_FALSE(isModifiedUtf8("\xE2\x82"));                          // truncated 3-byte
}

TEST(JavaText, DecodesStandardAndModifiedUtf8) {
  EXPECT_EQ(decodeUtf8("A\xC3\xA9\xE2\x82\xAC"), u"A\u00e9\u20ac");
  EXPECT_EQ(decodeUtf8("\xF0\x9F\x98\x80"), u"\U0001F600");
  EXPECT_EQ(decodeUtf8("\xED\xA0\xBD\xED\xB8\x80"), u"\U0001F600");
  EXPECT_EQ(decodeUtf8(std::string("a\0b", 3)), std::u16string(u"a\0b", 3));
  EXPECT_EQ(decodeUtf8(std::string("\xC0\x80", 2)), std::u16string(1, u'\0'));
}

TEST(JavaText, InvalidBytesBecomeReplacementCharacters) {
  EXPECT_EQ(decodeUtf8("\xFF" "a"), u"\uFFFDa");
  EXPECT_EQ(decodeUtf8("a\xC3"), u"a\uFFFD");
  EXPECT_EQ(decodeUtf8("\xE2\x82" "x"), u"\uFFFD\uFFFDx");
  EXPECT_EQ(decodeUtf8("\xF4\x90\x80\x80"), u"\uFFFD\uFFFD\uFFFD\uFFFD");  // above U+10FFFF
}

TEST(JavaText, EncodingGivesModifiedUtf8ThatDecodesBack) {
  const std::u16string text = std::u16string(u"x\0\u00e9\u20ac\U0001F600", 6);
  const std::string encoded = toModifiedUtf8(text);
  EXPECT_TRUE(isModifiedUtf8(encoded));
  EXPECT_EQ(encoded, std::string("x\xC0\x80\xC3\xA9\xE2\x82\xAC\xED\xA0\xBD\xED\xB8\x80"));
  EXPECT_EQ(decodeUtf8(encoded), text);
}

TEST(JavaText, SafeTextKeepsValidInputAndRepairsTheRest) {
  EXPECT_EQ(javaSafeText("vector index out of range"), "vector index out of range");
  const std::string repaired = javaSafeText("bad \xFF byte \xF0\x9F\x98\x80");
  EXPECT_TRUE(isModifiedUtf8(repaired));
  EXPECT_EQ(decodeUtf8(repaired), u"bad \uFFFD byte \U0001F600");
}

}  // namespace
