// The clipboard's file list block: how the explorer writes it and how it reads what is there.
#include "fileops/DropBlock.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

namespace {

std::uint32_t U32(const std::vector<unsigned char>& block, std::size_t at) {
    return block[at] | block[at + 1] << 8 | block[at + 2] << 16 |
           static_cast<std::uint32_t>(block[at + 3]) << 24;
}

std::vector<unsigned char> Header(unsigned char offset) {
    std::vector<unsigned char> block(20, 0);
    block[0] = offset;
    return block;
}

void Append(std::vector<unsigned char>& block, const std::string& text) {
    block.insert(block.end(), text.begin(), text.end());
    block.push_back(0);
}

} // namespace

TEST(DropBlock, TwoDrawingsAreFullPathsFromOffsetTwentyWithAFinalNul) {
    const std::vector<std::string> paths = {"C:\\dwg\\a.dwg", "C:\\dwg\\b.dwg"};
    const auto block = BuildDropBlock(paths);
    ASSERT_EQ(block.size(), 4096u);
    EXPECT_EQ(U32(block, 0), 20u);
    for (std::size_t at : {4u, 8u, 12u, 16u})
        EXPECT_EQ(U32(block, at), 0u) << at; // pt, fNC, fWide: ANSI
    EXPECT_EQ(std::memcmp(block.data() + 20, "C:\\dwg\\a.dwg\0C:\\dwg\\b.dwg\0\0", 27), 0);
    EXPECT_EQ(ReadDropBlock(block.data(), block.size()), paths);
}

TEST(DropBlock, NoSelectionIsTheHeaderAlone) {
    const auto block = BuildDropBlock({});
    ASSERT_EQ(block.size(), 4096u);
    EXPECT_EQ(U32(block, 0), 20u);
    EXPECT_TRUE(ReadDropBlock(block.data(), block.size()).empty());
}

TEST(DropBlock, GrowsInStepsOf4096AndKeepsAFinalNulAtAStepsEnd) {
    // Names that end exactly at 4096 bytes: the block takes one more step for the final NUL.
    const std::string name(4096 - 20 - 1, 'x');
    const auto block = BuildDropBlock({name});
    EXPECT_EQ(block.size(), 8192u);
    EXPECT_EQ(block[4096], 0);
    EXPECT_EQ(ReadDropBlock(block.data(), block.size()), std::vector<std::string>{name});
    const auto shorter = BuildDropBlock({std::string(4096 - 20 - 2, 'y')});
    EXPECT_EQ(shorter.size(), 4096u);
    std::vector<std::string> many;
    for (int i = 0; i < 1000; ++i)
        many.push_back("Z:\\a folder of drawings\\drawing number " + std::to_string(i) + ".dwg");
    const auto big = BuildDropBlock(many);
    EXPECT_EQ(big.size() % 4096, 0u);
    EXPECT_EQ(ReadDropBlock(big.data(), big.size()), many);
}

TEST(DropBlock, TheOffsetIsTheLowByteTakenAsASignedByte) {
    auto block = Header(20);
    block[1] = 1; // pFiles = 276: only its low byte counts
    Append(block, "a.dwg");
    block.push_back(0);
    EXPECT_EQ(ReadDropBlock(block.data(), block.size()), std::vector<std::string>{"a.dwg"});

    auto shifted = Header(24);
    shifted.insert(shifted.end(), 4, 'z');
    Append(shifted, "b.dwg");
    shifted.push_back(0);
    EXPECT_EQ(ReadDropBlock(shifted.data(), shifted.size()), std::vector<std::string>{"b.dwg"});
}

TEST(DropBlock, ANegativeOffsetReadsNothing) {
    auto block = Header(0x80); // -128
    Append(block, "a.dwg");
    block.push_back(0);
    EXPECT_TRUE(ReadDropBlock(block.data(), block.size()).empty());
    block[0] = 0xFF; // -1
    EXPECT_TRUE(ReadDropBlock(block.data(), block.size()).empty());
}

TEST(DropBlock, AnOffsetPastTheBlockReadsNothing) {
    auto block = Header(100);
    EXPECT_TRUE(ReadDropBlock(block.data(), block.size()).empty());
    block[0] = 20; // exactly at the end
    EXPECT_TRUE(ReadDropBlock(block.data(), block.size()).empty());
    EXPECT_TRUE(ReadDropBlock(block.data(), 0).empty());
    EXPECT_TRUE(ReadDropBlock(nullptr, 20).empty());
}

TEST(DropBlock, AMissingFinalEmptyNameStopsAtTheBlocksEnd) {
    auto block = Header(20);
    Append(block, "a.dwg");
    EXPECT_EQ(ReadDropBlock(block.data(), block.size()), std::vector<std::string>{"a.dwg"});
    // A name cut off by the block's end is not a name.
    const std::string cut = "b.dw";
    block.insert(block.end(), cut.begin(), cut.end());
    EXPECT_EQ(ReadDropBlock(block.data(), block.size()), std::vector<std::string>{"a.dwg"});
}

namespace {

// A wide list as the system's file manager puts it there: the header with fWide set, then UTF-16 names.
std::vector<unsigned char> WideBlock(const std::vector<std::u16string>& names, unsigned char offset = 20) {
    auto block = Header(offset);
    block[16] = 1; // fWide
    block.resize(offset, 'z');
    for (const std::u16string& name : names) {
        for (const char16_t c : name) {
            block.push_back(static_cast<unsigned char>(c & 0xFF));
            block.push_back(static_cast<unsigned char>(c >> 8));
        }
        block.push_back(0);
        block.push_back(0);
    }
    block.push_back(0);
    block.push_back(0);
    return block;
}

// A code page of the test's own: Latin-1, which holds U+0000..U+00FF and nothing else.
bool Latin1(const std::u16string& wide, std::string& narrow) {
    narrow.clear();
    for (const char16_t c : wide) {
        if (c > 0xFF)
            return false;
        narrow += static_cast<char>(c);
    }
    return true;
}

} // namespace

TEST(DropBlock, AWideListIsReadAsWide) {
    // Before, it was read as ANSI: each name's first character only, and no drawing, so no Paste.
    const auto block = WideBlock({u"Z:\\a.dwg", u"Z:\\b.dwg"});
    const DropList list = ReadDropList(block.data(), block.size(), &Latin1);
    EXPECT_TRUE(list.wide);
    EXPECT_EQ(list.names, (std::vector<std::string>{"Z:\\a.dwg", "Z:\\b.dwg"}));
    EXPECT_TRUE(list.unheld.empty());
    EXPECT_TRUE(DropListHoldsDrawings(list));
    EXPECT_EQ(ReadDropBlock(block.data(), block.size()), list.names);
}

TEST(DropBlock, AWideNameTheCodePageCannotHoldIsKeptApartNeverRenamed) {
    const std::u16string chinese = u"Z:\\\u4E2D\u6587.dwg";
    const auto block = WideBlock({u"Z:\\caf\u00E9.dwg", chinese, u"Z:\\c.txt"});
    const DropList list = ReadDropList(block.data(), block.size(), &Latin1);
    EXPECT_EQ(list.names, (std::vector<std::string>{"Z:\\caf\xE9.dwg", "Z:\\c.txt"}));
    EXPECT_EQ(list.unheld, std::vector<std::u16string>{chinese});
    // Alone, it still offers Paste, which then says why it pastes nothing.
    const auto alone = WideBlock({chinese});
    const DropList aloneList = ReadDropList(alone.data(), alone.size(), &Latin1);
    EXPECT_TRUE(aloneList.names.empty());
    EXPECT_TRUE(DropListHoldsDrawings(aloneList));
    const auto text = WideBlock({u"Z:\\\u4E2D.txt"});
    EXPECT_FALSE(DropListHoldsDrawings(ReadDropList(text.data(), text.size(), &Latin1)));
    // The portable converter holds ASCII only.
    std::string narrow;
    EXPECT_TRUE(AsciiOnly(u"Z:\\a.dwg", narrow));
    EXPECT_EQ(narrow, "Z:\\a.dwg");
    EXPECT_FALSE(AsciiOnly(u"Z:\\caf\u00E9.dwg", narrow));
}

TEST(DropBlock, AWideListIsBoundedByTheBlock) {
    // An odd offset, a name cut off by the block's end, a lone last byte, no converter.
    const auto odd = WideBlock({u"Z:\\a.dwg"}, 21);
    EXPECT_EQ(ReadDropList(odd.data(), odd.size(), &Latin1).names, std::vector<std::string>{"Z:\\a.dwg"});
    auto cut = WideBlock({u"Z:\\a.dwg"});
    cut.resize(cut.size() - 4); // the name's NUL and the list's are gone
    const DropList cutList = ReadDropList(cut.data(), cut.size(), &Latin1);
    EXPECT_TRUE(cutList.names.empty());
    EXPECT_TRUE(cutList.unheld.empty());
    cut.push_back(0); // one byte of a NUL: still no name
    EXPECT_TRUE(ReadDropList(cut.data(), cut.size(), &Latin1).names.empty());
    const auto block = WideBlock({u"Z:\\a.dwg"});
    const DropList none = ReadDropList(block.data(), block.size(), nullptr);
    EXPECT_TRUE(none.names.empty());
    EXPECT_EQ(none.unheld, std::vector<std::u16string>{u"Z:\\a.dwg"});
    // fWide in a block shorter than its header is not read: the block is ANSI.
    std::vector<unsigned char> shortBlock = {4, 0, 0, 0, 'a', 0, 0};
    EXPECT_EQ(ReadDropBlock(shortBlock.data(), shortBlock.size()), std::vector<std::string>{"a"});
}

TEST(DropBlock, ATextFileThenADrawingHoldsDrawings) {
    EXPECT_TRUE(ListHoldsDrawings({"C:\\x\\notes.txt", "C:\\x\\PLAN.DWG"}));
    EXPECT_FALSE(ListHoldsDrawings({"C:\\x\\notes.txt", "C:\\x\\plan.dwg.bak"}));
    EXPECT_FALSE(ListHoldsDrawings({}));
}

TEST(DropBlock, ExtensionsAreSplitAsTheRuntimeDoes) {
    EXPECT_EQ(PathExtension("C:\\a.b\\plan"), "");
    EXPECT_EQ(PathExtension("C:\\a\\plan.Dwg"), ".Dwg");
    EXPECT_EQ(PathExtension("plan.tar.dwg"), ".dwg");
    EXPECT_EQ(PathExtension("C:.dwg"), ".dwg");
    EXPECT_TRUE(IsDrawingPath("C:\\a\\b.DwG"));
    EXPECT_FALSE(IsDrawingPath("C:\\a.dwg\\b"));
    EXPECT_FALSE(IsDrawingPath(".dwgx"));
}

TEST(DropBlock, CopyToFileAddsDWGOnlyWithoutExtension) {
    EXPECT_EQ(CopyTargetName("C:\\out\\copy"), "C:\\out\\copy.DWG");
    EXPECT_EQ(CopyTargetName("C:\\out\\copy.txt"), "C:\\out\\copy.txt");
    EXPECT_EQ(CopyTargetName("C:\\out.d\\copy"), "C:\\out.d\\copy.DWG");
    EXPECT_EQ(CopyTargetName(""), "");
}
