#include "CArray.h"

#include <gtest/gtest.h>

#include <string>
#include <type_traits>

static_assert(!std::is_copy_constructible_v<CArray<int>>, "lists are never copied whole");
static_assert(!std::is_copy_assignable_v<CArray<int>>, "lists are never copied whole");

TEST(CArray, GrowsInWholeStepsOfTheGrowStep) {
    CArray<int> a;
    a.SetSize(0, 10);
    EXPECT_EQ(a.GetGrowBy(), 10);
    a.Add(1);
    EXPECT_EQ(a.GetAllocated(), 10u);
    for (int i = 0; i < 9; ++i)
        a.Add(i);
    EXPECT_EQ(a.GetAllocated(), 10u);
    a.Add(42);
    EXPECT_EQ(a.GetSize(), 11);
    EXPECT_EQ(a.GetAllocated(), 20u);
    EXPECT_EQ(a[10], 42);
}

TEST(CArray, SetSizeKeepsElementsAndDefaultsNewOnes) {
    CArray<std::string> a;
    a.Add("x");
    a.SetSize(3);
    EXPECT_EQ(a.GetSize(), 3);
    EXPECT_EQ(a[0], "x");
    EXPECT_EQ(a[2], "");
    a.SetSize(0);
    EXPECT_TRUE(a.IsEmpty());
    EXPECT_EQ(a.GetAllocated(), 0u);
}

TEST(CArray, FreeExtraShrinksToTheCount) {
    CArray<int> a;
    a.SetSize(0, 16);
    a.Add(1);
    a.Add(2);
    a.Add(3);
    EXPECT_EQ(a.GetAllocated(), 16u);
    a.FreeExtra();
    EXPECT_EQ(a.GetAllocated(), 3u);
    EXPECT_EQ(a[0], 1);
    EXPECT_EQ(a[2], 3);
}

TEST(CArray, InsertAndRemoveKeepOrder) {
    CArray<int> a;
    a.Add(1);
    a.Add(3);
    a.InsertAt(1, 2);
    a.InsertAt(3, 4);
    ASSERT_EQ(a.GetSize(), 4);
    for (int i = 0; i < 4; ++i)
        EXPECT_EQ(a[i], i + 1);
    a.RemoveAt(1, 2);
    ASSERT_EQ(a.GetSize(), 2);
    EXPECT_EQ(a[0], 1);
    EXPECT_EQ(a[1], 4);
    EXPECT_EQ(a.GetUpperBound(), 1);
}

TEST(CArray, IndexOutsideTheArrayIsAnInvalidArgument) {
    CArray<int> a;
    a.Add(7);
    EXPECT_THROW(a[1], CInvalidArgException);
    EXPECT_THROW(a[-1], CInvalidArgException);
    EXPECT_THROW(a.GetAt(5), CInvalidArgException);
    EXPECT_THROW(a.SetAt(1, 0), CInvalidArgException);
    EXPECT_THROW(a.InsertAt(2, 0), CInvalidArgException);
    EXPECT_THROW(a.RemoveAt(0, 2), CInvalidArgException);
    EXPECT_THROW(a.SetSize(-1), CInvalidArgException);
    EXPECT_EQ(a[0], 7);
}

TEST(CArray, InvalidArgumentIsAFrameworkExceptionWithText) {
    CArray<int> a;
    try {
        a.ElementAt(0);
        FAIL() << "no exception";
    } catch (const CException& e) {
        EXPECT_STREQ(e.what(), "Invalid argument.");
    }
}
