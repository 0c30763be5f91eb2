#include "devhost/ResultBuffers.h"
#include "devhost/Lisp.h"

#include <gtest/gtest.h>

#include <cstdarg>

namespace {

resbuf* Build(int type, ...) {
    va_list args;
    va_start(args, type);
    resbuf* chain = devhost::BuildChainV(type, args);
    va_end(args);
    return chain;
}

TEST(ResultBuffers, BuildListTakesEachKindOfValue) {
    const double point[3] = {1, 2, 3};
    const std::int64_t name[2] = {0xabc, 1};
    wchar_t text[] = L"abc";
    resbuf* chain = Build(RTSTR, text, RTLB, RTSHORT, 1, RTLONG, static_cast<std::int32_t>(100000), RTREAL,
                          2.5, RTPOINT, point, RTENAME, name, RTLE, RTNIL, devhost::kRtT, 0);
    ASSERT_NE(chain, nullptr);
    text[0] = L'X'; // the chain keeps its own copy
    EXPECT_EQ(devhost::PrintChain(chain),
              LR"(("abc" (1 100000 2.5 (1.0 2.0 3.0) <Entity name: abc>) nil T))");
    devhost::FreeChain(chain);
}

TEST(ResultBuffers, BuildListOfNothingIsEmpty) {
    EXPECT_EQ(Build(0), nullptr);
}

TEST(ResultBuffers, UnknownTypeGivesNoChain) {
    EXPECT_EQ(Build(RTSHORT, 1, 1234, 0), nullptr);
}

TEST(ResultBuffers, NullStringBecomesEmpty) {
    resbuf* chain = Build(RTSTR, static_cast<const wchar_t*>(nullptr), 0);
    ASSERT_NE(chain, nullptr);
    EXPECT_STREQ(chain->resval.rstring, L"");
    devhost::FreeChain(chain);
}

TEST(ResultBuffers, CopyIsDeep) {
    resbuf* chain = Build(RTSTR, L"one", RTSHORT, 2, 0);
    resbuf* copy = devhost::CopyChain(chain);
    ASSERT_NE(copy, nullptr);
    EXPECT_NE(copy->resval.rstring, chain->resval.rstring);
    devhost::FreeChain(chain);
    EXPECT_EQ(devhost::PrintChain(copy), L"(\"one\" 2)");
    devhost::FreeChain(copy);
    EXPECT_EQ(devhost::CopyChain(nullptr), nullptr);
}

TEST(ResultBuffers, NewNodeIsZeroed) {
    resbuf* node = devhost::NewNode(RTSHORT);
    ASSERT_NE(node, nullptr);
    EXPECT_EQ(node->restype, RTSHORT);
    EXPECT_EQ(node->rbnext, nullptr);
    EXPECT_EQ(node->resval.rint, 0);
    devhost::FreeChain(node);
    devhost::FreeChain(nullptr);
}

} // namespace
