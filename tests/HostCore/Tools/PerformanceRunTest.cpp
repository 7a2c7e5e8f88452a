// Performance Testing over the library's plug-ins: who runs, in which
// layout, and figures that hang together. Speed itself is the benchmarks'.
#include <gtest/gtest.h>

#include "HostCore/HostError.h"
#include "HostCore/Tools/PerformanceRun.h"

using zen::host::PerformanceRun;

TEST(PerformanceRun, RunsTheNamedPluginsInTheirLayoutAndReportsConsistentFigures) {
    PerformanceRun::Settings settings;
    settings.duration = 0.1;
    settings.blockSize = 256;
    settings.channels = 4;
    settings.plugins = {"test delay", "Soft Clipper:1517179747"};
    std::vector<std::string> heard;
    const auto results = PerformanceRun::Run(*GetZenPluginInterface(), settings,
                                             [&](const zen::host::PerformanceResult& r) { heard.push_back(r.name); });
    ASSERT_EQ(results.size(), 2u);
    EXPECT_EQ(heard, (std::vector<std::string>{"Soft Clipper", "Test Delay"}));  // key order
    EXPECT_EQ(results[0].channels, 4u);
    EXPECT_EQ(results[1].channels, 2u);  // the most Test Delay takes
    for (const auto& r : results) {
        EXPECT_TRUE(r.error.empty()) << r.name << ": " << r.error;
        EXPECT_DOUBLE_EQ(r.audioSeconds, 0.1);
        EXPECT_GT(r.cpuSeconds, 0.0);
        EXPECT_DOUBLE_EQ(r.realtimeFactor, r.audioSeconds / r.cpuSeconds);
        EXPECT_NEAR(r.cpuLoad * r.realtimeFactor, 100.0, 1e-9);
    }
    settings.plugins = {"Soft Clipper", "Sofft Clipper"};
    EXPECT_THROW(PerformanceRun::Run(*GetZenPluginInterface(), settings), zen::host::HostError);
}
