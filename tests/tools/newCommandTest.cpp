// SPDX-License-Identifier: BSL-1.0
/// New projects and uids, as the command line writes them. That the projects build, and pass their
/// tests, is tested with the installed package.
#include "tests/tools/toolsFixture.h"

#include "components/componentKit/uidLiteral.h"

#include <algorithm>
#include <cctype>
#include <map>
#include <set>
#include <sstream>

using namespace Mz;
using namespace Mz::Test;
using ::testing::AllOf;
using ::testing::Contains;
using ::testing::HasSubstr;
using ::testing::Not;

namespace {

class NewCommand : public ::testing::Test {
  protected:
    ProgramResult run(const std::vector<std::string>& arguments) const {
        return runCommandLine(arguments, work.path());
    }

    std::vector<std::string> linesOf(const std::vector<std::string>& arguments) const {
        const ProgramResult result = run(arguments);
        EXPECT_EQ(result.exitCode, 0);
        std::istringstream output(result.output);
        std::vector<std::string> lines;
        for (std::string line; std::getline(output, line);)
            lines.push_back(line);
        return lines;
    }

    /// Returns the files below a folder of the test, with their content.
    std::map<std::string, std::string> filesIn(const char* name) const {
        std::map<std::string, std::string> files;
        const std::filesystem::path root = work.path() / name;
        for (const auto& entry : std::filesystem::recursive_directory_iterator(root))
            if (entry.is_regular_file())
                files[entry.path().lexically_relative(root).generic_string()] =
                    contentOf(entry.path());
        return files;
    }

    std::size_t entriesInWork() const {
        return static_cast<std::size_t>(
            std::distance(std::filesystem::directory_iterator(work.path()), {}));
    }

    TemporaryDirectory work;
};

/// Whether the text is a uid of version 4: XXXXXXXX-XXXX-4XXX-[89AB]XXX-XXXXXXXXXXXX.
bool isRandomUid(const std::string& text) {
    if (text.size() != 36 || text[14] != '4' ||
        std::string("89AB").find(text[19]) == std::string::npos)
        return false;
    for (std::size_t index = 0; index < text.size(); ++index) {
        const bool hyphen = index == 8 || index == 13 || index == 18 || index == 23;
        const bool digit = std::string("0123456789ABCDEF").find(text[index]) != std::string::npos;
        if (hyphen ? text[index] != '-' : !digit)
            return false;
    }
    return true;
}

/// Returns the texts before `_uid` in all files.
std::multiset<std::string> uidsIn(const std::map<std::string, std::string>& files) {
    std::multiset<std::string> uids;
    for (const auto& [name, content] : files)
        for (std::size_t at = content.find("\"_uid"); at != std::string::npos;
             at = content.find("\"_uid", at + 1))
            if (at >= 36 && content[at - 1] != '.')
                uids.insert(content.substr(at - 36, 36));
    return uids;
}

const std::vector<std::vector<std::string>> kinds = {
    {"new", "component", "gauge"},
    {"new", "importer", "gauge", "--extension", "gau"},
    {"new", "host", "gauge"}};

std::vector<std::string> with(std::vector<std::string> arguments,
                              std::initializer_list<const char*> more) {
    arguments.insert(arguments.end(), more.begin(), more.end());
    return arguments;
}

TEST_F(NewCommand, UidsAreRandomAndNeverTwice) {
    std::set<std::string> uids;
    for (const std::vector<std::string>& arguments :
         {std::vector<std::string>{"uid"}, {"uid"}, {"uid", "998"}})
        for (const std::string& line : linesOf(arguments)) {
            EXPECT_TRUE(isRandomUid(line)) << line;
            uids.insert(line);
        }
    EXPECT_EQ(uids.size(), 1000u);
    // A digit that is not random would have one value.
    for (std::size_t index = 0; index < 36; ++index) {
        std::set<char> values;
        for (const std::string& uid : uids)
            values.insert(uid[index]);
        const bool fixed = index == 8 || index == 13 || index == 14 || index == 18 || index == 23;
        EXPECT_EQ(values.size(), fixed ? 1u : index == 19 ? 4u : 16u) << index;
    }
}

TEST_F(NewCommand, UidsAreAlsoWrittenAsWords) {
    const std::vector<std::string> lines = linesOf({"uid", "2", "--words"});
    ASSERT_EQ(lines.size(), 2u);
    for (const std::string& line : lines) { // {0x01234567, 0x89AB4DEF, 0x89ABCDEF, 0x01234567}
        ASSERT_EQ(line.size(), 48u) << line;
        const std::string text = line.substr(3, 8) + "-" + line.substr(15, 4) + "-" +
                                 line.substr(19, 4) + "-" + line.substr(27, 4) + "-" +
                                 line.substr(31, 4) + line.substr(39, 8);
        EXPECT_TRUE(isRandomUid(text)) << line;
        EXPECT_EQ(line.substr(0, 3) + line.substr(11, 4) + line.substr(23, 4) + line.substr(35, 4) +
                      line.substr(47),
                  "{0x, 0x, 0x, 0x}");
    }
    EXPECT_NE(lines[0], lines[1]);
}

TEST_F(NewCommand, TheNumberOfUidsIsBounded) {
    EXPECT_EQ(linesOf({"uid", "10000"}).size(), 10000u);
    for (const char* count : {"0", "10001", "-1", "two", "1.5", "", "99999999999999999999"})
        EXPECT_EQ(run({"uid", count}).exitCode, 2) << count;
}

TEST_F(NewCommand, EachKindIsWrittenWithoutPlaceholders) {
    for (const std::vector<std::string>& kind : kinds) {
        const ProgramResult result = run(with(kind, {"--directory", kind[1].c_str()}));
        ASSERT_EQ(result.exitCode, 0) << kind[1];
        EXPECT_THAT(result.output, HasSubstr("cmake --workflow --preset "));
        const auto files = filesIn(kind[1].c_str());
        for (const char* name :
             {"CMakeLists.txt", "CMakePresets.json", "README.md", ".gitignore", "mingw-w64.cmake"})
            EXPECT_TRUE(files.contains(name)) << kind[1] << ' ' << name;
        for (const auto& [name, content] : files) {
            EXPECT_EQ(content.find('@'), std::string::npos) << kind[1] << ' ' << name;
            EXPECT_EQ(content.find('\r'), std::string::npos) << kind[1] << ' ' << name;
            EXPECT_THAT(name, AllOf(Not(HasSubstr("NAME")), Not(HasSubstr("EXT"))));
        }
    }
}

TEST_F(NewCommand, EachProjectHasUidsOfItsOwn) {
    std::multiset<std::string> all;
    for (const std::vector<std::string>& kind : kinds)
        for (const char* directory : {"one", "two"}) {
            const std::string name = kind[1] + directory;
            ASSERT_EQ(run(with(kind, {"--directory", name.c_str()})).exitCode, 0);
            const std::multiset<std::string> uids = uidsIn(filesIn(name.c_str()));
            EXPECT_EQ(uids.size(), 2u) << name;
            all.insert(uids.begin(), uids.end());
        }
    for (const std::string& uid : all) {
        EXPECT_TRUE(isRandomUid(uid)) << uid; // so it is not nil
        EXPECT_EQ(all.count(uid), 1u) << uid;
    }
}

TEST_F(NewCommand, TheDirectoryHasTheNameOfTheProject) {
    ASSERT_EQ(run({"new", "component", "gauge"}).exitCode, 0);
    EXPECT_TRUE(filesIn("gauge").contains("gaugeComponent.cpp"));
    EXPECT_EQ(entriesInWork(), 1u);
}

TEST_F(NewCommand, AnEmptyDirectoryAndAPathOfNewOnesAreTaken) {
    std::filesystem::create_directory(work.path() / "empty");
    EXPECT_EQ(run({"new", "host", "gauge", "--directory", "empty"}).exitCode, 0);
    EXPECT_EQ(run({"new", "host", "gauge", "--directory", "a/b c/d"}).exitCode, 0);
    EXPECT_EQ(filesIn("empty").size(), filesIn("a/b c/d").size());
}

TEST_F(NewCommand, NothingIsOverwritten) {
    std::filesystem::create_directory(work.path() / "gauge");
    std::ofstream(work.path() / "gauge" / "README.md") << "mine";
    std::ofstream(work.path() / "file") << "mine";
    for (const std::vector<std::string>& kind : kinds) {
        EXPECT_EQ(run(kind).exitCode, 1);
        EXPECT_EQ(run(with(kind, {"--directory", "file"})).exitCode, 1);
        EXPECT_EQ(run(with(kind, {"--directory", "file/gauge"})).exitCode, 1);
    }
    EXPECT_EQ(filesIn("gauge"), (std::map<std::string, std::string>{{"README.md", "mine"}}));
    EXPECT_EQ(contentOf(work.path() / "file"), "mine");
    EXPECT_EQ(entriesInWork(), 2u);
}

TEST_F(NewCommand, OnlyIdentifiersAreNames) {
    const std::string longName(65, 'a');
    for (const char* name :
         {"", "2d", "a-b", "a b", "a.b", "a/b", "gr\xC3\xB6\xC3\x9F", "_a", "a__b", "class", "int",
          "co_await", "xor", "constinit", longName.c_str()})
        for (const std::vector<std::string>& kind : kinds) {
            std::vector<std::string> arguments = kind;
            arguments[2] = name;
            EXPECT_EQ(run(arguments).exitCode, 2) << name;
        }
    EXPECT_EQ(entriesInWork(), 0u);
    for (const char* name : {"final", "Class", "a_b2", longName.c_str() + 1})
        EXPECT_EQ(run({"new", "component", name}).exitCode, 0) << name;
}

TEST_F(NewCommand, ExtensionsHaveNeitherDotNorWildcardNorCapitals) {
    for (const char* extension : {"", ".gau", "*.gau", "*", "g?u", "Gau", "a b", "a/b", "a;b",
                                  "\xC3\xA4", "abcdefghijklmnopqrstuvwxyz0123456"})
        EXPECT_EQ(run({"new", "importer", "gauge", "--extension", extension}).exitCode, 2)
            << extension;
    EXPECT_EQ(run({"new", "importer", "gauge"}).exitCode, 2);
    EXPECT_EQ(run({"new", "importer", "gauge", "--extension", "a", "--extension", "a"}).exitCode,
              2);
    EXPECT_EQ(entriesInWork(), 0u);
}

TEST_F(NewCommand, AnImporterNamesAllItsExtensions) {
    ASSERT_EQ(
        run({"new", "importer", "--extension", "gau", "--extension", "7z+", "gauge"}).exitCode, 0);
    const auto files = filesIn("gauge");
    EXPECT_TRUE(files.contains("sample.gau"));
    EXPECT_THAT(files.at("gaugeImporter.cpp"), HasSubstr("{L\"gau\", L\"7z+\"}"));
}

TEST_F(NewCommand, WrongUseEndsWithTwo) {
    for (const std::vector<std::string>& arguments :
         {std::vector<std::string>{"new"},
          {"new", "nonsense", "gauge"},
          {"new", "component"},
          {"new", "component", "gauge", "gauge"},
          {"new", "component", "gauge", "--directory", ""},
          {"new", "component", "gauge", "--directory", "a;b"},
          {"new", "component", "gauge", "--extension", "gau"},
          {"uid", "1", "2"}})
        EXPECT_EQ(run(arguments).exitCode, 2) << arguments.back();
    EXPECT_EQ(entriesInWork(), 0u);
}

} // namespace
