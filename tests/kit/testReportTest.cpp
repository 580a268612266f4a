// SPDX-License-Identifier: BSL-1.0
// The report that receives the results of a component's own tests.
#include "components/componentKit/componentTest.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

using namespace Mz;

namespace {

class Report final : public Kit::TestReport {
  public:
    void begin(const wchar_t* name) override { events.push_back(std::wstring(L"begin ") + name); }
    void fail(const wchar_t* sentence) override {
        events.push_back(std::wstring(L"fail ") + sentence);
    }
    std::vector<std::wstring> events;
};

TEST(KitTestReport, ReportsARequirementThatIsNotMet) {
    Report report;
    EXPECT_TRUE(report.require(true, L"never"));
    EXPECT_TRUE(report.events.empty());
    EXPECT_FALSE(report.require(false, L"it is empty"));
    EXPECT_EQ(report.events, std::vector<std::wstring>{L"fail it is empty"});
}

} // namespace
