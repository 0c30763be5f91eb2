#include "thumbs/NameFold.h"

#include <gtest/gtest.h>

#include <initializer_list>
#include <string>

namespace {

TEST(NameFold, WesternTableFoldsEveryUpperCaseLetterOfTheCodePage) {
    const NameFoldTable t = Windows1252NameFold();
    for (int c = 'A'; c <= 'Z'; ++c)
        EXPECT_EQ(t.lower[c], c + 32) << c;
    for (int c = 0xC0; c <= 0xDE; ++c)
        EXPECT_EQ(t.lower[c], c == 0xD7 ? 0xD7 : c + 32) << c; // not the multiplication sign
    EXPECT_EQ(t.lower[0x8A], 0x9A);
    EXPECT_EQ(t.lower[0x8C], 0x9C);
    EXPECT_EQ(t.lower[0x8E], 0x9E);
    EXPECT_EQ(t.lower[0x9F], 0xFF);
    // Lower-case letters, digits, signs and the German sharp s stay.
    for (int c : {int{'a'}, int{'z'}, int{'0'}, int{'_'}, int{'.'}, 0xDF, 0xE9, 0xFF, 0x9A, 0x00, 0x7F})
        EXPECT_EQ(t.lower[c], c) << c;
    for (int c = 0; c < 256; ++c)
        EXPECT_FALSE(t.leadByte[c]);
}

TEST(NameFold, TheSharedTableIsBuiltOnce) {
    EXPECT_EQ(&NameFold(), &NameFold());
    EXPECT_EQ(NameFold().lower[static_cast<unsigned char>('Q')], 'q');
}

TEST(NameFold, FoldInPlaceAndCompare) {
    const NameFoldTable t = Windows1252NameFold();
    std::string name = "\xC9TAGE \xC0 PLAN.DWG";
    FoldNameInPlace(name, t);
    EXPECT_EQ(name, "\xE9tage \xE0 plan.dwg");
    EXPECT_EQ(CompareNamesNoCase("\xC9tage.dwg", "\xE9TAGE.DWG", t), 0);
    EXPECT_LT(CompareNamesNoCase("plan", "plan.dwg", t), 0);
    EXPECT_GT(CompareNamesNoCase("\xE9", "z", t), 0);
    EXPECT_TRUE(StartsWithNoCase("\xE9tage.dwg", "\xC9T", t));
    EXPECT_TRUE(StartsWithNoCase("plan.dwg", "PLAN.DWG", t)); // a whole name starts with itself
    EXPECT_TRUE(StartsWithNoCase("plan.dwg", "", t));
    EXPECT_FALSE(StartsWithNoCase("plan", "plan.dwg", t));
    EXPECT_FALSE(StartsWithNoCase("plan.dwg", "plb", t));
}

// A double-byte code page: 0x81 starts a two-byte character whose second byte may be an ASCII letter.
unsigned char LowerAscii(unsigned char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<unsigned char>(c + 32) : c;
}
bool Lead81(unsigned char c) {
    return c == 0x81;
}

// Bytes as they are, for the texts of a double-byte code page.
std::string Bytes(std::initializer_list<int> bytes) {
    std::string text;
    for (int b : bytes)
        text += static_cast<char>(b);
    return text;
}

TEST(NameFold, SecondBytesOfDoubleByteCharactersAreKept) {
    const NameFoldTable t = MakeNameFold(&LowerAscii, &Lead81);
    EXPECT_TRUE(t.leadByte[0x81]);
    EXPECT_EQ(t.lower[0x81], 0x81);
    // The A after the lead byte is half of a character; a lead byte at the end stays.
    std::string name = Bytes({'A', 0x81, 'A', 'B', 0x81});
    FoldNameInPlace(name, t);
    EXPECT_EQ(name, Bytes({'a', 0x81, 'A', 'b', 0x81}));
    EXPECT_NE(CompareNamesNoCase(Bytes({0x81, 'A'}), Bytes({0x81, 'a'}), t), 0);
    EXPECT_EQ(CompareNamesNoCase(Bytes({'X', 0x81, 'A'}), Bytes({'x', 0x81, 'A'}), t), 0);
    EXPECT_TRUE(StartsWithNoCase(Bytes({0x81, 'A', 'b'}), Bytes({0x81, 'A'}), t));
    EXPECT_FALSE(StartsWithNoCase(Bytes({0x81, 'A', 'b'}), Bytes({0x81, 'a'}), t));
}

} // namespace
