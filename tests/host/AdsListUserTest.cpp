#include "FakeHost.h"
#include "host/AdsListUser.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace {

struct AdsListUserTest : ::testing::Test {
    FakeHost host;
};

TEST_F(AdsListUserTest, EmptyListHasNothing) {
    ads_list_user list;
    EXPECT_TRUE(list.IsEmpty());
    EXPECT_EQ(list.Head(), nullptr);
    EXPECT_EQ(list.Next(), nullptr);
}

TEST_F(AdsListUserTest, EveryOperandKindAppendsItsNode) {
    ads_list_user list;
    const long name[2] = {11, 22};
    const ads_point point = {1.5, 2.5, 3.5};
    list + ads_int(7) + 70000L + ads_real(2.25) + "text" + name + point + BeginList() + EndList();
    ASSERT_FALSE(list.IsEmpty());
    const short expected[] = {RTSHORT, RTLONG, RTREAL, RTSTR, RTENAME, RTPOINT, RTLB, RTLE};
    list.ResetCursor();
    for (short type : expected) {
        resbuf* rb = list.Next();
        ASSERT_NE(rb, nullptr);
        EXPECT_EQ(rb->restype, type);
    }
    EXPECT_EQ(list.Next(), nullptr);
    EXPECT_EQ(PrintChain(list.Head()), "(7 70000 2.25 \"text\" <ename 11 22> (1.5 2.5 3.5) ())");
    EXPECT_EQ(list.LastAppended()->restype, RTLE);
    list.Release();
    EXPECT_TRUE(list.IsEmpty());
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(AdsListUserTest, TailIsTerminatedAfterEveryAppend) {
    ads_list_user list;
    list + "a" + "b";
    resbuf* last = list.Head()->rbnext;
    EXPECT_EQ(last->rbnext, nullptr);
    list.Release();
}

TEST_F(AdsListUserTest, RetListHandsTheChainToLisp) {
    ads_list_user list;
    list + "C:\\dwg\\a.dwg" + BeginList() + "0" + "7" + "" + EndList();
    list.RetList();
    EXPECT_EQ(host.result, "(\"C:\\dwg\\a.dwg\" (\"0\" \"7\" \"\"))");
    list.Release();
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(AdsListUserTest, CopyIsDeep) {
    ads_list_user list;
    list + "one" + ads_int(2) + BeginList() + "three" + EndList();
    ads_list_user copy(list);
    EXPECT_EQ(PrintChain(copy.Head()), PrintChain(list.Head()));
    EXPECT_NE(copy.Head(), list.Head());
    EXPECT_NE(copy.Head()->resval.rstring, list.Head()->resval.rstring);
    list.Release();
    EXPECT_EQ(PrintChain(copy.Head()), "(\"one\" 2 (\"three\"))"); // still whole after the source is gone
    ads_list_user* heap = copy.Copy();
    EXPECT_EQ(PrintChain(heap->Head()), PrintChain(copy.Head()));
    heap->Release();
    delete heap;
    copy.Release();
    EXPECT_EQ(host.liveNodes, 0);
    EXPECT_TRUE(host.events.empty());
}

struct FailureCase {
    const char* message;
    void (*append)(ads_list_user&);
};

class AdsListUserFailure : public AdsListUserTest, public ::testing::WithParamInterface<FailureCase> {};

TEST_P(AdsListUserFailure, ReportsThroughTheFailureReportAndKeepsTheList) {
    ads_list_user list;
    list + "kept";
    host.failAllocationAt = 1;
    GetParam().append(list);
    ASSERT_EQ(host.events.size(), 1u);
    EXPECT_EQ(host.events[0], std::string("fail:") + GetParam().message);
    EXPECT_EQ(PrintChain(list.Head()), "(\"kept\")");
    list.Release();
    EXPECT_EQ(host.liveNodes, 0);
}

INSTANTIATE_TEST_SUITE_P(
    EveryOperand, AdsListUserFailure,
    ::testing::Values(FailureCase{"\n Error of allocate memory ads_list_user & operator + (ads_int)",
                                  [](ads_list_user& l) { l + ads_int(1); }},
                      FailureCase{"\n Error of allocate memory ads_list_user & operator + (long )",
                                  [](ads_list_user& l) { l + 5L; }},
                      FailureCase{"\n Error of allocate memory ads_list_user & operator + (ads_real)",
                                  [](ads_list_user& l) { l + ads_real(1.0); }},
                      FailureCase{"\n Error of allocate memory ads_list_user & operator + (char * )",
                                  [](ads_list_user& l) { l + "x"; }},
                      FailureCase{"\n Error of allocate memory ads_list_user & operator + (long r[2])",
                                  [](ads_list_user& l) {
                                      const long n[2] = {1, 2};
                                      l + n;
                                  }},
                      FailureCase{"\n Error of allocate memory ads_list_user & operator + (ads_point)",
                                  [](ads_list_user& l) {
                                      const ads_point p = {0, 0, 0};
                                      l + p;
                                  }}));

TEST_F(AdsListUserTest, CopyReportsEachNodeItCannotAllocateAndGoesOn) {
    ads_list_user list;
    list + "a" + ads_int(2) + "c";
    host.failAllocationAt = 2; // the second node of the copy
    ads_list_user copy(list);
    ASSERT_EQ(host.events.size(), 1u);
    EXPECT_EQ(host.events[0], "fail:\n Error of allocate memory ads_list_user(ads_list_user &");
    EXPECT_EQ(PrintChain(copy.Head()), "(\"a\" \"c\")");
    copy.Release();
    list.Release();
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(AdsListUserTest, CopyReportsATextItCannotAllocate) {
    ads_list_user list;
    list + "a" + "b";
    static int calls;
    calls = 0;
    ads_list_user::s_allocText = [](std::size_t n) -> void* {
        return ++calls == 1 ? nullptr : std::malloc(n);
    };
    ads_list_user copy(list);
    ads_list_user::s_allocText = &std::malloc;
    ASSERT_EQ(host.events.size(), 1u);
    EXPECT_EQ(host.events[0], "fail:\n Error of allocate memory ads_list_user(ads_list_user &");
    EXPECT_EQ(PrintChain(copy.Head()), "(\"b\")");
    copy.Release();
    list.Release();
    EXPECT_EQ(host.liveNodes, 0);
}

} // namespace
