#include "devhost/Options.h"

#include <gtest/gtest.h>

namespace {

using devhost::Options;

Options Parse(const std::vector<std::wstring>& args) {
    Options options;
    std::wstring error;
    EXPECT_TRUE(devhost::ParseOptions(args, options, error)) << std::string(error.begin(), error.end());
    return options;
}

std::wstring Error(const std::vector<std::wstring>& args) {
    Options options;
    std::wstring error;
    EXPECT_FALSE(devhost::ParseOptions(args, options, error));
    return error;
}

TEST(Options, Defaults) {
    const Options options = Parse({});
    EXPECT_TRUE(options.arx.empty());
    EXPECT_EQ(options.order, Options::Order::ModuleFirst);
    EXPECT_EQ(options.drawings, 1);
    EXPECT_TRUE(options.layers.empty());
    EXPECT_FALSE(options.alertBox);
    EXPECT_EQ(options.afterMs, -1);
    EXPECT_EQ(options.post, Options::Post::None);
    EXPECT_TRUE(options.evals.empty());
    EXPECT_TRUE(options.script.empty());
    EXPECT_FALSE(options.verbose);
    EXPECT_FALSE(options.timing);
    EXPECT_EQ(options.preview, Options::Preview::Real);
}

TEST(Options, EveryOption) {
    const Options options =
        Parse({L"--arx",   L"x.arx",    L"--order", L"entry-first", L"--drawings",  L"3",
               L"--layer", L"WALLS=1",  L"--layer", L"A=B=250",     L"--alert-box", L"--after-ms",
               L"500",     L"--post",   L"cancel",  L"--eval",      L"(f 1)",       L"--eval",
               L"(g)",     L"--script", L"s.txt",   L"--verbose",   L"--timing"});
    EXPECT_EQ(options.arx, L"x.arx");
    EXPECT_EQ(options.order, Options::Order::EntryFirst);
    EXPECT_EQ(options.drawings, 3);
    ASSERT_EQ(options.layers.size(), 2u);
    EXPECT_EQ(options.layers[0].name, L"WALLS");
    EXPECT_EQ(options.layers[0].colorIndex, 1);
    EXPECT_EQ(options.layers[1].name, L"A=B");
    EXPECT_EQ(options.layers[1].colorIndex, 250);
    EXPECT_TRUE(options.alertBox);
    EXPECT_EQ(options.afterMs, 500);
    EXPECT_EQ(options.post, Options::Post::Cancel);
    EXPECT_EQ(options.evals, (std::vector<std::wstring>{L"(f 1)", L"(g)"}));
    EXPECT_EQ(options.script, L"s.txt");
    EXPECT_TRUE(options.verbose);
    EXPECT_TRUE(options.timing);
    EXPECT_EQ(Parse({L"--order", L"module-first"}).order, Options::Order::ModuleFirst);
    EXPECT_EQ(Parse({L"--after-ms", L"0", L"--post", L"accept"}).post, Options::Post::Accept);
    EXPECT_EQ(Parse({L"--refuse-window", L"Orvex1:"}).refuseWindow, L"Orvex1:");
    EXPECT_TRUE(Parse({L"--check-heaps"}).checkHeaps);
    EXPECT_FALSE(Parse({}).checkHeaps);
    EXPECT_EQ(Parse({L"--preview", L"flat"}).preview, Options::Preview::Flat);
    EXPECT_TRUE(Parse({L"--timing-sent"}).timing);
    EXPECT_TRUE(Parse({L"--timing-sent"}).timingSent);
    EXPECT_FALSE(Parse({L"--timing"}).timingSent);
    EXPECT_EQ(Parse({L"--preview", L"real"}).preview, Options::Preview::Real);
    EXPECT_EQ(Parse({}).fileLatencyMs, 0);
    EXPECT_EQ(Parse({L"--file-latency", L"20"}).fileLatencyMs, 20);
    EXPECT_TRUE(Parse({}).fileHang.empty());
    EXPECT_EQ(Parse({L"--file-hang", L"b.dwg"}).fileHang, L"b.dwg");
    EXPECT_EQ(Parse({}).scanLatencyMs, 0);
    EXPECT_EQ(Parse({L"--scan-latency", L"50"}).scanLatencyMs, 50);
}

TEST(Options, FileDelaysRefused) {
    EXPECT_EQ(Error({L"--file-latency", L"-1"}),
              L"--file-latency takes milliseconds from 0 to 60000, not -1");
    EXPECT_EQ(Error({L"--file-latency", L"60001"}),
              L"--file-latency takes milliseconds from 0 to 60000, not 60001");
    EXPECT_EQ(Error({L"--file-latency"}), L"--file-latency needs a value");
    EXPECT_EQ(Error({L"--file-hang", L""}), L"--file-hang needs a file name");
    EXPECT_EQ(Error({L"--scan-latency", L"60001"}),
              L"--scan-latency takes milliseconds from 0 to 60000, not 60001");
    EXPECT_EQ(Error({L"--scan-latency"}), L"--scan-latency needs a value");
}

TEST(Options, BadUsage) {
    EXPECT_EQ(Error({L"--bogus"}), L"unknown option --bogus");
    EXPECT_EQ(Error({L"--arx"}), L"--arx needs a value");
    EXPECT_EQ(Error({L"--order", L"sideways"}), L"--order takes entry-first or module-first, not sideways");
    EXPECT_EQ(Error({L"--drawings", L"0"}), L"--drawings takes a number from 1 to 64, not 0");
    EXPECT_EQ(Error({L"--drawings", L"x"}), L"--drawings takes a number from 1 to 64, not x");
    EXPECT_EQ(Error({L"--layer", L"WALLS"}), L"--layer takes NAME=ACI with ACI from 0 to 256, not WALLS");
    EXPECT_EQ(Error({L"--layer", L"=3"}), L"--layer takes NAME=ACI with ACI from 0 to 256, not =3");
    EXPECT_EQ(Error({L"--layer", L"A=257"}), L"--layer takes NAME=ACI with ACI from 0 to 256, not A=257");
    EXPECT_EQ(Error({L"--after-ms", L"10"}), L"--after-ms and --post go together");
    EXPECT_EQ(Error({L"--post", L"accept"}), L"--after-ms and --post go together");
    EXPECT_EQ(Error({L"--refuse-window", L""}),
              L"--refuse-window needs the beginning of a window class name");
    EXPECT_EQ(Error({L"--preview", L"blurry"}), L"--preview takes real or flat, not blurry");
    EXPECT_EQ(Error({L"--preview"}), L"--preview needs a value");
    EXPECT_EQ(Error({L"--after-ms", L"10", L"--post", L"maybe"}),
              L"--post takes accept or cancel, not maybe");
}

} // namespace
