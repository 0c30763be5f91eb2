// The shell's double-NUL name lists as the file operation builds them.
#include "fileops/NameList.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

TEST(NameList, NothingAddedIsNoListAtAll) {
    NameList list;
    EXPECT_EQ(list.Data(), nullptr);
    EXPECT_EQ(list.Capacity(), 0u);
    EXPECT_EQ(list.Length(), 0u);
}

TEST(NameList, OneNameEndsInTwoNuls) {
    NameList list;
    list.Add("C:\\a.dwg");
    ASSERT_NE(list.Data(), nullptr);
    EXPECT_EQ(std::memcmp(list.Data(), "C:\\a.dwg\0\0", 10), 0);
    EXPECT_EQ(list.Length(), 9u);
    // list length + 1 + (name length + 1): exactly what is needed.
    EXPECT_EQ(list.Capacity(), 10u);
}

TEST(NameList, EachNameGrowsTheBlockToExactlyTheNeededSize) {
    NameList list;
    list.Add("ab");
    list.Add("cde");
    EXPECT_EQ(list.Length(), 7u);
    EXPECT_EQ(list.Capacity(), 3u + 1u + 4u);
    EXPECT_EQ(std::memcmp(list.Data(), "ab\0cde\0\0", 8), 0);
    list.Add("");
    // An empty name would end the list early: it is stored, and the shell sees the list end there.
    EXPECT_EQ(list.Length(), 8u);
    EXPECT_EQ((std::vector<std::string>{"ab", "cde"}), list.Names());
}

TEST(NameList, ClearFreesTheBlock) {
    NameList list;
    list.Add("x");
    list.Clear();
    EXPECT_EQ(list.Data(), nullptr);
    EXPECT_EQ(list.Capacity(), 0u);
    EXPECT_EQ(list.Length(), 0u);
    list.Add("y");
    EXPECT_EQ(list.Names(), std::vector<std::string>{"y"});
}

TEST(NameList, ManyNamesKeepTheirOrder) {
    NameList list;
    std::vector<std::string> names;
    for (int i = 0; i < 500; ++i) {
        names.push_back("C:\\folder\\drawing-" + std::to_string(i) + ".dwg");
        list.Add(names.back());
    }
    EXPECT_EQ(list.Names(), names);
    EXPECT_EQ(list.Data()[list.Length()], '\0');
}
