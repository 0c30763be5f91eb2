#include "test_support.h"

#include <gtest/gtest.h>

#include <type_traits>

static_assert(!std::is_copy_constructible_v<CBitmap> && !std::is_copy_assignable_v<CBitmap>);
static_assert(std::is_nothrow_move_constructible_v<CBitmap> && std::is_nothrow_move_assignable_v<CBitmap>);
static_assert(!std::is_copy_constructible_v<CDC> && !std::is_copy_constructible_v<CSelectObject>);

TEST(Gdi, BitmapIsDeletedOnceByItsLastOwner) {
    CClientDC screen(nullptr);
    CBitmap a;
    ASSERT_TRUE(a.CreateCompatibleBitmap(screen, 4, 4));
    HBITMAP h = a;
    ASSERT_NE(h, nullptr);
    CBitmap b(std::move(a));
    EXPECT_EQ(a.GetSafeHandle(), nullptr);
    EXPECT_EQ(b.GetSafeHandle(), h);
    EXPECT_EQ(::GetObjectType(h), static_cast<DWORD>(OBJ_BITMAP));
    b.DeleteObject();
    EXPECT_EQ(::GetObjectType(h), 0u);
}

TEST(Gdi, SelectObjectRestorerPutsTheOldObjectBack) {
    CClientDC screen(nullptr);
    HDC mem = ::CreateCompatibleDC(screen);
    HGDIOBJ before = ::GetCurrentObject(mem, OBJ_PEN);
    HPEN pen = ::CreatePen(PS_SOLID, 1, RGB(255, 0, 0));
    {
        CSelectObject sel(mem, pen);
        EXPECT_EQ(::GetCurrentObject(mem, OBJ_PEN), static_cast<HGDIOBJ>(pen));
    }
    EXPECT_EQ(::GetCurrentObject(mem, OBJ_PEN), before);
    ::DeleteDC(mem);
    ::DeleteObject(pen);
}

TEST(Geometry, RectHelpers) {
    CRect rc(10, 20, 110, 70);
    EXPECT_EQ(rc.Width(), 100);
    EXPECT_EQ(rc.Height(), 50);
    EXPECT_EQ(rc.CenterPoint(), CPoint(60, 45));
    EXPECT_TRUE(rc.PtInRect(CPoint(10, 20)));
    EXPECT_FALSE(rc.PtInRect(CPoint(110, 20)));
    rc.OffsetRect(5, -5);
    EXPECT_EQ(rc, CRect(15, 15, 115, 65));
    rc.DeflateRect(5, 5);
    EXPECT_EQ(rc, CRect(20, 20, 110, 60));
    CRect flipped(10, 10, 0, 0);
    EXPECT_TRUE(flipped.IsRectEmpty());
    flipped.NormalizeRect();
    EXPECT_EQ(flipped, CRect(0, 0, 10, 10));
    EXPECT_EQ(CPoint(MAKELPARAM(-3, 4)), CPoint(-3, 4));
}
