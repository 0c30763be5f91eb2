#include "FakeHost.h"
#include "host/EntryPoint.h"
#include "host/Orvex.h"
#include "tests/support/CancellingPicker.h"

#include <gtest/gtest.h>

namespace {

struct EntryPointTest : ::testing::Test {
    FakeHost host;
    testsupport::CancellingPicker platform;
    void* appId = reinterpret_cast<void*>(std::uintptr_t{42});
};

TEST_F(EntryPointTest, UnusedMessagesDoNothing) {
    for (int message : {0, 2, 6, 7, 100, -1}) {
        EXPECT_EQ(DispatchEntryMessage(message, appId, platform), AcRx::kRetOK);
    }
    EXPECT_TRUE(host.calls.empty());
    EXPECT_TRUE(host.events.empty());
    EXPECT_EQ(host.result, "unset");
}

TEST_F(EntryPointTest, InitialisationUnlocksAndRegistersAsMdiAware) {
    EXPECT_EQ(DispatchEntryMessage(AcRx::kInitAppMsg, appId, platform), AcRx::kRetOK);
    EXPECT_EQ(host.calls, (std::vector<std::string>{"lookup DynamicLinker", "unlock 42",
                                                    "lookup DynamicLinker", "mdi 42"}));
}

TEST_F(EntryPointTest, DrawingLoadDefinesAndUnloadUndefinesOrvexAsCodeZero) {
    DispatchEntryMessage(AcRx::kLoadDwgMsg, appId, platform);
    DispatchEntryMessage(AcRx::kUnloadDwgMsg, appId, platform);
    EXPECT_EQ(host.calls, (std::vector<std::string>{"defun Orvex 0", "undef Orvex 0"}));
}

TEST_F(EntryPointTest, FailedDefinitionStillAnswersOk) {
    host.failDefunAt = 1;
    EXPECT_EQ(DispatchEntryMessage(AcRx::kLoadDwgMsg, appId, platform), AcRx::kRetOK);
    EXPECT_EQ(host.calls.size(), 1u);
}

TEST_F(EntryPointTest, InvokeWithCodeZeroRunsThePickerOnce) {
    host.funCode = 0;
    host.AddShort(1);
    host.AddShort(2);
    host.AddString(L"");
    host.AddString(L"Insert");
    host.AddString(L"");
    DispatchEntryMessage(AcRx::kInvkSubrMsg, appId, platform);
    EXPECT_EQ(platform.runs, 1);
    EXPECT_EQ(platform.handed.acceptCaption, "Insert");
    EXPECT_EQ(platform.handed.cancelCaption, "Cancel");
    EXPECT_EQ(host.result, "nil");
}

TEST_F(EntryPointTest, InvokeWithAnotherCodeRunsNothingAndLeavesNoValue) {
    for (int code : {-1, -5, 1, 2}) {
        host.funCode = code;
        host.result = "unset";
        DispatchEntryMessage(AcRx::kInvkSubrMsg, appId, platform);
        EXPECT_EQ(host.result, "void") << code;
    }
    EXPECT_EQ(platform.runs, 0);
}

TEST(ApiVersionTest, ReportsNineteenFiveZeroZero) {
    std::uint32_t v[4] = {9, 9, 9, 9};
    ApiVersion(&v[0], &v[1], &v[2], &v[3]);
    EXPECT_EQ(v[0], 19u);
    EXPECT_EQ(v[1], 5u);
    EXPECT_EQ(v[2], 0u);
    EXPECT_EQ(v[3], 0u);
}

TEST(HostApiTest, MissingOperationDegradesAndIsReportedOnce) {
    SetHostApi(HostApi{});
    EXPECT_EQ(acedDefun(L"Orvex", 0), RTERROR);
    EXPECT_EQ(acutNewRb(RTSHORT), nullptr);
    EXPECT_EQ(acedGetArgs(), nullptr);
    EXPECT_NE(MissingHostOperations().find("acedDefun"), std::string::npos);
    // Only once per operation, with printing available:
    FakeHost host;
    HostApi api = Host();
    api.acedAlert = nullptr;
    SetHostApi(api);
    acedAlert(L"x");
    acedAlert(L"y");
    ASSERT_EQ(host.events.size(), 1u);
    EXPECT_EQ(host.events[0],
              "print:\nOrvex1: the host does not provide acedAlert; that feature is not available.\n");
}

TEST(HostApiTest, MissingOperationTheLibraryMakesUpForSaysWhatItDoesInstead) {
    FakeHost host;
    HostApi api = Host();
    api.acdbDisplayPreviewFromDwg = nullptr;
    SetHostApi(api);
    ReportMissingHostOperation("acdbDisplayPreviewFromDwg", "the library draws the previews itself");
    ReportMissingHostOperation("acdbDisplayPreviewFromDwg", "the library draws the previews itself");
    ASSERT_EQ(host.events.size(), 1u);
    EXPECT_EQ(host.events[0],
              "print:\nOrvex1: the host does not provide acdbDisplayPreviewFromDwg; the library "
              "draws the previews itself.\n");
}

} // namespace
