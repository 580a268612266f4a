// SPDX-License-Identifier: BSL-1.0
/// Tests where the tools look for dependencies, by comparison with the system's loader.
#include "tests/tools/toolsFixture.h"

#include <cstdlib>
#include <optional>
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

/// Sets the search path of the loader for the tools; the loader itself has read it before.
class SearchPath {
  public:
    explicit SearchPath(const std::string& path) { ::setenv("LD_LIBRARY_PATH", path.c_str(), 1); }
    ~SearchPath() {
        if (before)
            ::setenv("LD_LIBRARY_PATH", before->c_str(), 1);
        else
            ::unsetenv("LD_LIBRARY_PATH");
    }
    SearchPath(const SearchPath&) = delete;
    SearchPath& operator=(const SearchPath&) = delete;

  private:
    static std::optional<std::string> now() {
        const char* const path = std::getenv("LD_LIBRARY_PATH");
        return path ? std::optional<std::string>(path) : std::nullopt;
    }
    const std::optional<std::string> before = now();
};

TEST(LoaderPathOfTheEnvironment, HasFoldersBetweenColonsAndSemicolons) {
    const std::filesystem::path file = builtComponent(L"neededThroughRunpath", L"needed");
    const std::string leaf = (file.parent_path() / "leaf").string();
    const auto verdictWith = [&](const std::string& path) {
        const SearchPath set(path);
        return explainFile(file).verdict.verdict;
    };
    EXPECT_EQ(verdictWith(""), Verdict::dependencyMissing);
    EXPECT_EQ(verdictWith("/nowhere"), Verdict::dependencyMissing);
    for (const std::string& path :
         {leaf, leaf + ":/nowhere", "/nowhere:" + leaf, "/nowhere;" + leaf + ";/nowhere"})
        EXPECT_EQ(verdictWith(path), Verdict::component) << path;
}

TEST(LoaderPathOfTheEnvironment, HasTheCurrentFolderWhereAnEntryIsEmpty) {
    const std::filesystem::path file = builtComponent(L"neededThroughRunpath", L"needed");
    const std::filesystem::path before = std::filesystem::current_path();
    std::filesystem::current_path(file.parent_path() / "leaf");
    for (const char* const path : {":/nowhere", "/nowhere::/nowhere", ";/nowhere"}) {
        const SearchPath set(path);
        EXPECT_EQ(explainFile(file).verdict.verdict, Verdict::component) << path;
    }
    std::filesystem::current_path(before);
}

} // namespace
