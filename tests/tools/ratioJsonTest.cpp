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

Json written(const std::vector<RatioLine>& lines) {
    std::ostringstream out;
    writeJson(out, lines);
    return Json::parse(out.str(), nullptr, false);
}

TEST(RatioJson, IsReadBackWhateverItsTextsAre) {
    const std::string text = "a \"quoted\" \\ text\n\tof \xC3\xBC";
    const Json all = written({{text, text, "b", 1.23456, 2, 0.61728, 0.5, 1.1}, {}});
    ASSERT_EQ(all.size(), 2u);
    EXPECT_EQ(all[0].at("name"), text);
    EXPECT_EQ(all[0].at("work"), text);
    EXPECT_EQ(all[0].at("limit"), "b");
    EXPECT_EQ(all[0].at("workNanoseconds"), 1.235);
    EXPECT_EQ(all[0].at("ratio"), 0.6173);
    EXPECT_EQ(all[0].at("reach"), 1.1);
    EXPECT_FALSE(all[1].contains("reach"));
}

TEST(RatioJson, IsReadBackWithoutLinesAndWithFiguresThatAreNone) {
    EXPECT_EQ(written({}), Json::array());
    const double none = std::numeric_limits<double>::quiet_NaN();
    EXPECT_TRUE(written({{"\xFF", "", "", none, none, none, none, {}}})[0].at("ratio").is_null());
}

} // namespace
