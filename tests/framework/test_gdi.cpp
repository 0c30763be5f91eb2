#include "test_support.h"

#include <gtest/gtest.h>

#include <type_traits>

static_assert(!std::is_copy_constructible_v<CBrush> && !std::is_copy_assignable_v<CBrush>);
static_assert(!std::is_copy_constructible_v<CPen> && !std::is_copy_assignable_v<CPen>);
static_assert(!std::is_copy_constructible_v<CFont> && !std::is_copy_assignable_v<CFont>);
static_assert(!std::is_copy_constructible_v<CBitmap> && !std::is_copy_assignable_v<CBitmap>);
static_assert(std::is_nothrow_move_constructible_v<CBrush> && std::is_nothrow_move_assignable_v<CBrush>);
static_assert(!std::is_copy_constructible_v<CDC> && !std::is_copy_constructible_v<CSelectObject>);

TEST(Gdi, BrushIsDeletedOnceByItsLastOwner) {
    CBrush a(RGB(1, 2, 3));
    HBRUSH h = a;
    ASSERT_NE(h, nullptr);
    CBrush b(std::move(a));
    EXPECT_EQ(a.GetSafeHandle(), nullptr);
    EXPECT_EQ(b.GetSafeHandle(), h);
    EXPECT_EQ(::GetObjectType(h), static_cast<DWORD>(OBJ_BRUSH));
    b.DeleteObject();
    EXPECT_EQ(::GetObjectType(h), 0u);
}

TEST(Gdi, SelectObjectRestorerPutsTheOldObjectBack) {
    CClientDC screen(nullptr);
    HDC mem = ::CreateCompatibleDC(screen);
    HGDIOBJ before = ::GetCurrentObject(mem, OBJ_PEN);
    {
        CPen pen(PS_SOLID, 1, RGB(255, 0, 0));
        CSelectObject sel(mem, pen);
        EXPECT_EQ(::GetCurrentObject(mem, OBJ_PEN), static_cast<HGDIOBJ>(pen));
    }
    EXPECT_EQ(::GetCurrentObject(mem, OBJ_PEN), before);
    ::DeleteDC(mem);
}

TEST(Gdi, MemoryDcCopiesItsPictureToTheTargetOnDestruction) {
    CClientDC screen(nullptr);
    HDC target = ::CreateCompatibleDC(screen);
    CBitmap bmp;
    ASSERT_TRUE(bmp.CreateCompatibleBitmap(screen, 40, 40));
    HGDIOBJ old = ::SelectObject(target, bmp);
    CDC dc(target);
    dc.FillSolidRect(CRect(0, 0, 40, 40), RGB(255, 255, 255));
    {
        CMemDC mem(target, CRect(10, 10, 30, 30));
        mem.FillSolidRect(CRect(10, 10, 30, 30), RGB(0, 0, 255));
        EXPECT_EQ(dc.GetPixel(15, 15), RGB(255, 255, 255)); // nothing on the target yet
    }
    EXPECT_EQ(dc.GetPixel(15, 15), RGB(0, 0, 255));
    EXPECT_EQ(dc.GetPixel(5, 5), RGB(255, 255, 255));
    ::SelectObject(target, old);
    ::DeleteDC(target);
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
