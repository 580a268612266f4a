// SPDX-License-Identifier: BSL-1.0
/// Tests the table of the benchmarks in JSON.
#include "benchmarks/ratioJson.h"

#include <gtest/gtest.h>

#include <limits>
#include <nlohmann/json.hpp>
#include <sstream>

using namespace Mz::Benchmarks;
using Json = nlohmann::json;

namespace {

Json written(const std::vector<RatioLine>& lines, const std::vector<MemoryLine>& memory = {}) {
    std::ostringstream out;
    writeJson(out, {"GCC \"12\"", "-O2", 25}, lines, memory);
    return Json::parse(out.str(), nullptr, false);
}

TEST(RatioJson, IsReadBackWhateverItsTextsAre) {
    const std::string text = "a \"quoted\" \\ text\n\tof \xC3\xBC";
    const RatioLine line{text, text, "b", 1.23456, 2, 0.61728, 0.5, 1.1, {}, {{"c", 3.5}}};
    const Json all = written({line, RatioLine{}});
    EXPECT_EQ(all.at("compiler"), "GCC \"12\"");
    EXPECT_EQ(all.at("options"), "-O2");
    EXPECT_EQ(all.at("repetitions"), 25);
    const Json& times = all.at("times");
    ASSERT_EQ(times.size(), 2u);
    EXPECT_EQ(times[0].at("name"), text);
    EXPECT_EQ(times[0].at("work"), text);
    EXPECT_EQ(times[0].at("limit"), "b");
    EXPECT_EQ(times[0].at("workNanoseconds"), 1.235);
    EXPECT_EQ(times[0].at("ratio"), 0.6173);
    EXPECT_EQ(times[0].at("reach"), 1.1);
    EXPECT_FALSE(times[0].contains("peerReach"));
    ASSERT_EQ(times[0].at("peers").size(), 1u);
    EXPECT_EQ(times[0].at("peers")[0].at("name"), "c");
    EXPECT_EQ(times[0].at("peers")[0].at("nanoseconds"), 3.5);
    EXPECT_FALSE(times[1].contains("reach"));
    EXPECT_FALSE(times[1].contains("peers"));
}

TEST(RatioJson, IsReadBackWithoutLinesAndWithFiguresThatAreNone) {
    EXPECT_EQ(written({}).at("times"), Json::array());
    EXPECT_EQ(written({}).at("memory"), Json::array());
    const double none = std::numeric_limits<double>::quiet_NaN();
    RatioLine line;
    line.name = "\xFF";
    line.ratio = none;
    EXPECT_TRUE(written({line}).at("times")[0].at("ratio").is_null());
}

TEST(RatioJson, HasTheMemoryInBytes) {
    const Json all = written({}, {{"start", "a start", "an empty one", 1024.4, 512}});
    ASSERT_EQ(all.at("memory").size(), 1u);
    EXPECT_EQ(all.at("memory")[0].at("work"), "a start");
    EXPECT_EQ(all.at("memory")[0].at("workBytes"), 1024);
    EXPECT_EQ(all.at("memory")[0].at("limitBytes"), 512);
}

} // namespace
