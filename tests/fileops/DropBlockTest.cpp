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

TEST(DropBlock, AWideListYieldsTheFirstCharacterOfEachName) {
    auto block = Header(20);
    block[16] = 1; // fWide, not consulted
    for (const char* name : {"Z:\\a.dwg", "Z:\\b.dwg"}) {
        for (const char* p = name; *p; ++p) {
            block.push_back(static_cast<unsigned char>(*p));
            block.push_back(0);
        }
        block.push_back(0);
        block.push_back(0);
    }
    block.push_back(0);
    block.push_back(0);
    // Read as ANSI, each wide character of the first name is a name of its own and the wide NUL that
    // ends the first name ends the list.
    const auto names = ReadDropBlock(block.data(), block.size());
    EXPECT_EQ(names, (std::vector<std::string>{"Z", ":", "\\", "a", ".", "d", "w", "g"}));
    EXPECT_FALSE(ListHoldsDrawings(names));
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
