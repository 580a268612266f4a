// SPDX-License-Identifier: BSL-1.0
// Tests which components count as changed at the start of a host.
#include "components/componentTools/starting/changes.h"
#include "tests/support/temporaryDirectory.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

using namespace Mz::Tools;
using namespace Mz::Test;

namespace {

class ChangedLast : public testing::Test {
  protected:
    /// Returns the names of the files that changed last, each followed by a blank.
    std::wstring changed() const {
        std::wstring names;
        for (const auto& [directory, fileName] : changedLast(list(), components)) {
            EXPECT_EQ(directory, L"\\components");
            names += fileName + L" ";
        }
        return names;
    }

    std::filesystem::path list() const { return folder.path() / "list"; }
    std::filesystem::path file() const { return folder.path() / "list.starts.json"; }

    std::string content() const {
        std::ifstream stream(file(), std::ios::binary);
        return std::string(std::istreambuf_iterator<char>(stream), {});
    }

    TemporaryDirectory folder;
    RecordedLibraries components{{L"\\components", L"a", 10, 100, {}},
                                 {L"\\components", L"b", 20, 200, {}}};
};

TEST_F(ChangedLast, AreThoseThatAreNewOrHaveAnotherTimeOrSize) {
    EXPECT_EQ(changed(), L"a b ");
    components[0].time = 11;
    EXPECT_EQ(changed(), L"a ");
    components[1].size = 201;
    EXPECT_EQ(changed(), L"b ");
    components.push_back({L"\\components", L"c", 30, 300, {}});
    EXPECT_EQ(changed(), L"c ");
    components[0].time = 12;
    components[1].time = 19;
    EXPECT_EQ(changed(), L"a b ");
}

TEST_F(ChangedLast, AreThoseOfAnEarlierStartIfNothingChangedSince) {
    changed();
    components[1].time = 21;
    for (int start = 0; start < 3; ++start)
        EXPECT_EQ(changed(), L"b ") << start;
    components.pop_back(); // Gone, which changes no other.
    EXPECT_EQ(changed(), L"");
}

TEST_F(ChangedLast, AreStoredBesideTheList) {
    changed();
    components[1].time = 21;
    changed();
    EXPECT_EQ(content(), R"({
  "version": 1,
  "components": [
    {
      "directory": "\\components",
      "fileName": "a",
      "time": 10,
      "size": 100,
      "changed": false
    },
    {
      "directory": "\\components",
      "fileName": "b",
      "time": 21,
      "size": 200,
      "changed": true
    }
  ]
}
)");
}

TEST_F(ChangedLast, AreAllIfTheFileIsDamagedOrOfAnotherVersion) {
    changed();
    components[1].time = 21;
    ASSERT_EQ(changed(), L"b ");
    const std::string whole = content();
    std::string other = whole;
    other.replace(other.find("\"version\": 1"), 12, "\"version\": 2");
    for (const std::string& damaged : {other, std::string(), whole.substr(0, whole.size() / 2),
                                       std::string(R"({"version": 1})"), std::string("[]")}) {
        folder.write("list.starts.json", damaged);
        EXPECT_EQ(changed(), L"a b ") << damaged;
        components[1].time += 1;
        EXPECT_EQ(changed(), L"b ") << "after " << damaged;
    }
}

TEST_F(ChangedLast, AreComparedWithAnOlderStartIfTheFileCannotBeWritten) {
    std::filesystem::create_directory(file());
    for (int start = 0; start < 2; ++start)
        EXPECT_EQ(changed(), L"a b ") << start;
    EXPECT_TRUE(std::filesystem::is_directory(file()));
}

} // namespace
