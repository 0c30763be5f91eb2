#include "preview/PictureQueue.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

PictureKey Key(const std::string& name, int width = 100, int height = 80) {
    PictureKey key;
    key.path = "Z:\\share\\" + name;
    key.fileSize = 1000;
    key.writeTime = 1700000000;
    key.width = width;
    key.height = height;
    return key;
}

std::vector<PictureKey> Keys(const std::vector<std::string>& names) {
    std::vector<PictureKey> keys;
    for (const std::string& name : names)
        keys.push_back(Key(name));
    return keys;
}

std::vector<std::string> TakeAll(PictureQueue& queue) {
    std::vector<std::string> names;
    PictureKey key;
    while (queue.Take(key))
        names.push_back(key.path.substr(std::string("Z:\\share\\").size()));
    return names;
}

Picture Pixels(int width, int height) {
    Picture picture;
    picture.state = PictureState::Drawn;
    picture.width = width;
    picture.height = height;
    picture.pixels.assign(static_cast<std::size_t>(width) * height, 0x00112233u);
    return picture;
}

TEST(PictureOrder, VisibleCellsTopToBottomThenOneScreenBelowAfterAStepDown) {
    // 3 columns, rows 2 to 3 visible (cells 6..11), scrolled down: then rows 4 and 5.
    EXPECT_EQ(PictureOrder(6, 6, 6, +1, 100), (std::vector<int>{6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16, 17}));
}

TEST(PictureOrder, AfterAStepUpTheScreenAboveNearestFirst) {
    EXPECT_EQ(PictureOrder(6, 6, 6, -1, 100), (std::vector<int>{6, 7, 8, 9, 10, 11, 5, 4, 3, 2, 1, 0}));
}

TEST(PictureOrder, EdgesOfTheListAreLeftOut) {
    EXPECT_EQ(PictureOrder(0, 6, 6, -1, 100), (std::vector<int>{0, 1, 2, 3, 4, 5}));
    EXPECT_EQ(PictureOrder(96, 6, 6, +1, 100), (std::vector<int>{96, 97, 98, 99}));
    EXPECT_TRUE(PictureOrder(0, 6, 6, +1, 0).empty());
    EXPECT_TRUE(PictureOrder(0, 0, 0, +1, 10).empty());
}

TEST(PictureQueue, ReadsInTheOrderWanted) {
    PictureQueue queue;
    queue.Want(Keys({"a.dwg", "b.dwg", "c.dwg"}));
    EXPECT_EQ(TakeAll(queue), (std::vector<std::string>{"a.dwg", "b.dwg", "c.dwg"}));
    EXPECT_EQ(queue.Taken(), 3u);
}

TEST(PictureQueue, ACellThatLeftTheScreenBeforeItsReadBeganIsDropped) {
    PictureQueue queue;
    queue.Want(Keys({"a.dwg", "b.dwg", "c.dwg", "d.dwg"}));
    PictureKey first;
    ASSERT_TRUE(queue.Take(first)); // a.dwg is being read
    // A step down: b and c left the screen; e and f came.
    queue.Want(Keys({"d.dwg", "e.dwg", "f.dwg"}));
    EXPECT_EQ(queue.Dropped(), 2u);
    EXPECT_TRUE(queue.Knows(Key("a.dwg"))) << "a read taken goes on";
    EXPECT_FALSE(queue.Knows(Key("b.dwg")));
    EXPECT_EQ(TakeAll(queue), (std::vector<std::string>{"d.dwg", "e.dwg", "f.dwg"}));
}

TEST(PictureQueue, AJumpNeverWaitsForTheRowsItSkipped) {
    PictureQueue queue;
    std::vector<std::string> top;
    for (int i = 0; i < 40; ++i)
        top.push_back("top" + std::to_string(i) + ".dwg");
    queue.Want(Keys(top));
    PictureKey key;
    ASSERT_TRUE(queue.Take(key));
    ASSERT_TRUE(queue.Take(key));
    // End: the last screen is all that is wanted now; the 38 reads of the top not begun are gone.
    queue.Want(Keys({"end1.dwg", "end2.dwg"}));
    EXPECT_EQ(queue.Waiting(), 2u);
    EXPECT_EQ(TakeAll(queue).front(), "end1.dwg");
    EXPECT_EQ(queue.Dropped(), 38u);
}

TEST(PictureQueue, AReadTakenIsNotQueuedAgainUntilItEnds) {
    PictureQueue queue;
    queue.Want(Keys({"a.dwg"}));
    PictureKey key;
    ASSERT_TRUE(queue.Take(key));
    queue.Want(Keys({"a.dwg", "b.dwg"}));
    EXPECT_EQ(TakeAll(queue), (std::vector<std::string>{"b.dwg"}));
    queue.Finished(Key("a.dwg"));
    EXPECT_FALSE(queue.Knows(Key("a.dwg")));
    queue.Want(Keys({"a.dwg"}));
    EXPECT_EQ(TakeAll(queue), (std::vector<std::string>{"a.dwg"}));
}

TEST(PictureQueue, AKeyWantedTwiceIsReadOnce) {
    PictureQueue queue;
    queue.Want(Keys({"a.dwg", "a.dwg", "b.dwg"}));
    EXPECT_EQ(TakeAll(queue), (std::vector<std::string>{"a.dwg", "b.dwg"}));
}

TEST(PictureKey, AChangedFileOrAnotherSizeIsAnotherPicture) {
    PictureKey changed = Key("a.dwg");
    changed.writeTime += 2;
    PictureKey grown = Key("a.dwg");
    grown.fileSize += 1;
    EXPECT_FALSE(changed == Key("a.dwg"));
    EXPECT_FALSE(grown == Key("a.dwg"));
    EXPECT_FALSE(Key("a.dwg", 120, 80) == Key("a.dwg"));
    EXPECT_TRUE(Key("a.dwg") == Key("a.dwg"));
}

TEST(PictureCache, KeepsWhatFitsAndDropsTheLeastRecentlyUsed) {
    const std::size_t one = PictureCache::CostOf(Key("a.dwg"), Pixels(100, 80));
    PictureCache cache(3 * one);
    cache.Put(Key("a.dwg"), Pixels(100, 80));
    cache.Put(Key("b.dwg"), Pixels(100, 80));
    cache.Put(Key("c.dwg"), Pixels(100, 80));
    EXPECT_EQ(cache.Count(), 3u);
    ASSERT_NE(cache.Find(Key("a.dwg")), nullptr); // a is used again: b is now the oldest
    cache.Put(Key("d.dwg"), Pixels(100, 80));
    EXPECT_EQ(cache.Count(), 3u);
    EXPECT_LE(cache.Bytes(), cache.Bound());
    EXPECT_EQ(cache.Find(Key("b.dwg")), nullptr);
    EXPECT_NE(cache.Find(Key("a.dwg")), nullptr);
    EXPECT_NE(cache.Find(Key("c.dwg")), nullptr);
    EXPECT_NE(cache.Find(Key("d.dwg")), nullptr);
}

TEST(PictureCache, StaysWithinItsBoundInBytes) {
    PictureCache cache(std::size_t{1} << 20);
    for (int i = 0; i < 200; ++i) {
        cache.Put(Key("d" + std::to_string(i) + ".dwg"), Pixels(120, 90));
        EXPECT_LE(cache.Bytes(), cache.Bound());
    }
    EXPECT_EQ(cache.Count(), (std::size_t{1} << 20) / PictureCache::CostOf(Key("d100.dwg"), Pixels(120, 90)));
}

TEST(PictureCache, ThePictureJustPutIsKeptEvenWhenLargerThanTheBound) {
    PictureCache cache(1000);
    cache.Put(Key("small.dwg", 2, 2), Pixels(2, 2));
    cache.Put(Key("big.dwg"), Pixels(100, 80));
    EXPECT_NE(cache.Find(Key("big.dwg")), nullptr);
    EXPECT_EQ(cache.Find(Key("small.dwg", 2, 2)), nullptr);
    EXPECT_EQ(cache.Count(), 1u);
}

TEST(PictureCache, PicturesOnTheScreenAreNeverDropped) {
    // A screen larger than the bound: its pictures stay, the others go first.
    const std::size_t one = PictureCache::CostOf(Key("a.dwg"), Pixels(100, 80));
    PictureCache cache(2 * one);
    cache.Pin(Keys({"s1.dwg", "s2.dwg", "s3.dwg"}));
    cache.Put(Key("s1.dwg"), Pixels(100, 80));
    cache.Put(Key("s2.dwg"), Pixels(100, 80));
    cache.Put(Key("ahead.dwg"), Pixels(100, 80));
    cache.Put(Key("s3.dwg"), Pixels(100, 80));
    EXPECT_EQ(cache.Find(Key("ahead.dwg")), nullptr);
    EXPECT_NE(cache.Find(Key("s1.dwg")), nullptr);
    EXPECT_NE(cache.Find(Key("s2.dwg")), nullptr);
    EXPECT_NE(cache.Find(Key("s3.dwg")), nullptr);
    // Scrolled on: the old screen may go.
    cache.Pin(Keys({"t1.dwg"}));
    cache.Put(Key("t1.dwg"), Pixels(100, 80));
    EXPECT_LE(cache.Bytes(), cache.Bound());
    EXPECT_NE(cache.Find(Key("t1.dwg")), nullptr);
}

TEST(PictureCache, PuttingAKeyAgainReplacesItsPicture) {
    PictureCache cache(kDefaultPictureCacheBytes);
    cache.Put(Key("a.dwg"), Pixels(100, 80));
    Picture none;
    none.state = PictureState::NoPreview;
    none.width = 100;
    none.height = 80;
    none.pixels.assign(8000, 0);
    cache.Put(Key("a.dwg"), none);
    ASSERT_NE(cache.Find(Key("a.dwg")), nullptr);
    EXPECT_EQ(cache.Find(Key("a.dwg"))->state, PictureState::NoPreview);
    EXPECT_EQ(cache.Count(), 1u);
    EXPECT_EQ(cache.Bytes(), PictureCache::CostOf(Key("a.dwg"), none));
}

} // namespace
