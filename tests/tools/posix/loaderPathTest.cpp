// SPDX-License-Identifier: BSL-1.0
/// Tests where the tools look for dependencies, by comparison with the system's loader.
#include "tests/tools/toolsFixture.h"

#include <string>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

struct Case {
    const wchar_t* library;
    bool loads;
};

void PrintTo(const Case& item, std::ostream* out) {
    *out << std::filesystem::path(item.library);
}

class LoaderPath : public ::testing::TestWithParam<Case> {};

TEST_P(LoaderPath, OfADependencyIsThatOfTheLoader) {
    const std::filesystem::path file = builtComponent(GetParam().library, L"needed");
    const Explanation explanation = explainFile(file);
    void* const module = loadAsHost(file);
    EXPECT_EQ(module != nullptr, GetParam().loads);
    EXPECT_EQ(explanation.verdict.verdict,
              GetParam().loads ? Verdict::component : Verdict::dependencyMissing);
    if (module)
        unloadAsHost(module);
}

INSTANTIATE_TEST_SUITE_P(Needed, LoaderPath,
                         ::testing::Values(Case{L"neededThroughRpath", true},
                                           Case{L"neededThroughRunpath", false},
                                           Case{L"neededBehindRunpath", false},
                                           Case{L"neededByOrigin", true},
                                           Case{L"neededByLostOrigin", false}),
                         [](const ::testing::TestParamInfo<Case>& tested) {
                             return std::filesystem::path(tested.param.library).string();
                         });

} // namespace
