// SPDX-License-Identifier: BSL-1.0
/// The command line, as scripts use it.
#include "tests/tools/toolsFixture.h"

#include "components/componentManager/version.h"

#include <nlohmann/json.hpp>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::AllOf;
using ::testing::AnyOf;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::Not;
using ::testing::StartsWith;
using Json = nlohmann::json;

namespace {

class Command : public ToolsTest {
  protected:
    ProgramResult run(const std::vector<std::string>& arguments) const {
        return runCommandLine(arguments, work.path());
    }

    /// The same, with the result as JSON and the test's folder as the search path.
    Json json(int status, std::vector<std::string> arguments) const {
        arguments.insert(arguments.end(), {"--json", "--path", path()});
        const ProgramResult result = run(arguments);
        EXPECT_EQ(result.exitCode, status) << result.output;
        const Json value = Json::parse(result.output, nullptr, false);
        EXPECT_FALSE(value.is_discarded()) << result.output;
        return value;
    }

    std::string path() const { return folder.path().string(); }
    std::string inWork(const char* name) const { return (work.path() / name).string(); }

    TemporaryDirectory work;
};

TEST_F(Command, WrongUseEndsWithTwo) {
    EXPECT_EQ(run({}).exitCode, 2);
    EXPECT_EQ(run({"nonsense"}).exitCode, 2);
    EXPECT_EQ(run({"list", "--nonsense"}).exitCode, 2);
    EXPECT_EQ(run({"explain"}).exitCode, 2);
    EXPECT_EQ(run({"scan"}).exitCode, 2);
    EXPECT_EQ(run({"scan", "--cache", "x", "--time-limit", "never"}).exitCode, 2);
    EXPECT_EQ(run({"scan", "--cache", "x", "--time-limit", "-1"}).exitCode, 2);
    EXPECT_EQ(run({"scan", "--cache", "x", "--time-limit", "nan"}).exitCode, 2);
    EXPECT_EQ(run({"types", "--path", ""}).exitCode, 2);
    EXPECT_EQ(run({"types", "--path", ";;"}).exitCode, 2);
    EXPECT_EQ(run({"explain", "x", "--cache", ""}).exitCode, 2);
    EXPECT_EQ(run({"import", "x", "--save", ""}).exitCode, 2);
    EXPECT_EQ(run({"graph", "--output", ""}).exitCode, 2);
    EXPECT_EQ(run({"graph", "--svg", ""}).exitCode, 2);
}

TEST_F(Command, AnEmptyNameOfTheListIsWrongUse) {
    add(L"goodWithKit");
    const ProgramResult result = run({"scan", "--path", path(), "--cache", ""});
    EXPECT_EQ(result.exitCode, 2);
    EXPECT_EQ(result.output, "");
}

TEST_F(Command, LeavesNoVerdictsBesideAFolderThatIsNamedAsTheList) {
    add(L"crashesInEntryPoint");
    for (const char* name : {"empty", "full"})
        std::filesystem::create_directory(work.path() / name);
    std::ofstream(work.path() / "full" / "file") << "content";
    for (const char* name : {"empty", "full"}) {
        const Json result = json(1, {"scan", "--cache", inWork(name)});
        EXPECT_THAT(std::string(result.at("notWritten")),
                    EndsWith(std::string(name) + ": nothing was written, for this is a folder"));
        EXPECT_EQ(result.at("files").at(0).at("verdict"), "crashed");
    }
    int entries = 0;
    for (const auto& entry : std::filesystem::directory_iterator(work.path()))
        entries += entry.is_directory() ? 1 : 100;
    EXPECT_EQ(entries, 2);
}

TEST_F(Command, HelpSaysWhatEachDoesWithAnExample) {
    const ProgramResult help = run({"--help"});
    EXPECT_EQ(help.exitCode, 0);
    for (const char* command : {"check", "new", "uid", "help"})
        EXPECT_THAT(run({command, "--help"}).output,
                    HasSubstr("Example:\n  mzcomponents " + std::string(command)));
    for (const char* command :
         {"list", "explain", "scan", "profile", "types", "import", "show", "graph"}) {
        EXPECT_THAT(help.output, HasSubstr(command));
        const ProgramResult own = run({command, "--help"});
        EXPECT_EQ(own.exitCode, 0);
        EXPECT_THAT(own.output, HasSubstr("Example:\n  mzcomponents " + std::string(command)));
        for (const char* option : {"--path", "--cache", "--json"})
            EXPECT_THAT(own.output, HasSubstr(option)) << command;
    }
}

TEST_F(Command, HelpNamesTheKindOfEachValue) {
    for (const char* command :
         {"list", "explain", "scan", "types", "import", "show", "graph", "check", "uid"})
        EXPECT_THAT(run({command, "--help"}).output, ::testing::Not(HasSubstr("TEXT"))) << command;
    for (const char* kind : {"component", "importer", "host"})
        EXPECT_THAT(run({"new", kind, "--help"}).output,
                    AllOf(::testing::Not(HasSubstr("TEXT")), HasSubstr("--directory PATH")));
    EXPECT_THAT(run({"graph", "--help"}).output,
                AllOf(HasSubstr("--path PATH "), HasSubstr("--cache FILE "),
                      HasSubstr("--output FILE "), HasSubstr("--svg FILE ")));
}

TEST_F(Command, OneIsNotFollowedByAPlural) {
    add(L"goodWithKit", "a");
    EXPECT_THAT(run({"scan", "--path", path(), "--cache", inWork("list")}).output,
                HasSubstr("1 file: 1 with builders, 0 with faults, 0 others; 1 looked at"));
    EXPECT_THAT(run({"show", inWork("list")}).output, StartsWith("recorded list, 1 library\n"));
    folder.write("b", "text");
    EXPECT_THAT(run({"scan", "--path", path(), "--cache", inWork("list")}).output,
                HasSubstr("2 files: 1 with builders, 0 with faults, 1 other; "));
    EXPECT_THAT(run({"show", inWork("list")}).output, StartsWith("recorded list, 2 libraries\n"));
}

TEST_F(Command, ListGivesEachCandidateItsVerdictAndRunsNothing) {
    add(L"goodWithKit", "a");
    add(L"crashesInInitialiser", "b");
    add(L"noEntryPoint", "c");
    folder.write("d", "text");
    const Json files = json(0, {"list"}).at("files");
    ASSERT_EQ(files.size(), 4u);
    EXPECT_EQ(files[0].at("verdict"), "component");
    EXPECT_EQ(files[1].at("verdict"), "component");
    EXPECT_EQ(files[2].at("verdict"), "noEntryPoint");
    EXPECT_EQ(files[3].at("verdict"), "notALibrary");
    const std::string lines = run({"list", "--path", path()}).output;
    // Some systems show the names in the form in which they are recorded.
    EXPECT_THAT(lines, StartsWith("component             "));
    EXPECT_THAT(lines, HasSubstr(folder.path().filename().string()));
    EXPECT_EQ(std::count(lines.begin(), lines.end(), '\n'), 4);
}

TEST_F(Command, ListEndsWithOneWhereSomethingIsWrong) {
    EXPECT_EQ(run({"list", "--path", path() + "-not-there"}).exitCode, 1);
    EXPECT_EQ(run({"list", "--path", path(), "--cache", inWork("no-list")}).exitCode, 1);
    EXPECT_EQ(run({"list", "--path", path()}).exitCode, 0);
    add(L"missesDependency", "a");
    EXPECT_EQ(json(1, {"list"}).at("files").at(0).at("verdict"), "dependencyMissing");
}

TEST_F(Command, NamesBothSidesOfALibraryForAnotherAbi) {
    const std::string file = add(L"stampedOtherVersion", "a").string();
    add(L"stampedNewer", "b");
    const std::string theirs = "SOVERSION " + std::to_string(MZ_SOVERSION + 1) + " (version";
    const std::string ours = "SOVERSION " + std::to_string(MZ_SOVERSION) + " (version";
    const auto expect = [&](const Json& files) {
        EXPECT_EQ(files.at(0).at("verdict"), "otherAbi");
        EXPECT_THAT(files.at(0).at("sentence").get<std::string>(),
                    AllOf(HasSubstr(theirs), HasSubstr(ours)));
        EXPECT_THAT(files.at(0).at("cure").get<std::string>(), HasSubstr(ours));
    };
    expect(json(1, {"explain", file}).at("files"));
    expect(json(1, {"explain", "--load", file}).at("files"));
    for (const char* command : {"scan", "list"}) {
        const Json files = json(1, {command, "--cache", inWork("list")}).at("files");
        expect(files);
        EXPECT_EQ(files.at(1).at("verdict"),
                  std::string(command) == "scan" ? "works" : "component");
        const std::string text = run({command, "--path", path(), "--cache", inWork("list")}).output;
        EXPECT_THAT(text, StartsWith("otherAbi "));
        EXPECT_THAT(text, AllOf(HasSubstr(theirs), HasSubstr(ours)));
    }
    const std::string text = run({"explain", file}).output;
    EXPECT_THAT(text, AllOf(HasSubstr(": otherAbi\n"), HasSubstr(theirs), HasSubstr(ours),
                            HasSubstr("\n    cure: build it with ")));
}

TEST_F(Command, ExplainTellsTheCureAndWhatIsNeeded) {
    const auto file = add(L"missesDependency").string();
    const Json entry = json(1, {"explain", file}).at("files").at(0);
    EXPECT_EQ(entry.at("verdict"), "dependencyMissing");
    EXPECT_THAT(entry.at("cure").get<std::string>(), HasSubstr("absentDependency"));
    EXPECT_GT(entry.at("dependencies").size(), 1u);
    EXPECT_THAT(run({"explain", file}).output, HasSubstr("    cure: install what has absent"));
}

TEST_F(Command, ExplainLoadsTheFileWhenTold) {
    const auto crash = add(L"crashesInEntryPoint").string(), kit = add(L"goodWithKit").string();
    EXPECT_EQ(json(0, {"explain", crash}).at("files").at(0).at("verdict"), "component");
    EXPECT_EQ(json(1, {"explain", "--load", crash}).at("files").at(0).at("verdict"), "crashed");
    const Json entry = json(0, {"explain", "--load", kit}).at("files").at(0);
    EXPECT_EQ(entry.at("verdict"), "works");
    EXPECT_EQ(entry.at("label"), "Kit label");
    EXPECT_EQ(entry.at("builders").at(0).at("name"), "kit");
    EXPECT_EQ(json(1, {"explain", "missing"}).at("files").at(0).at("verdict"), "missing");
}

TEST_F(Command, AFileThatBeginsWithASlashIsNoOption) {
    EXPECT_EQ(json(1, {"explain", "/missing/file"}).at("files").at(0).at("verdict"), "missing");
    EXPECT_EQ(json(1, {"explain", "/missing"}).at("files").at(0).at("verdict"), "missing");
}

TEST_F(Command, ScanFromARelativePathServesAHost) {
    add(L"goodWithKit");
    const auto sub = work.path() / "sub";
    std::filesystem::create_directory(sub);
    const auto file = sub / "kit";
    std::filesystem::copy_file(builtComponent(L"goodWithKit"), file);
    EXPECT_EQ(run({"scan", "--path", "./sub/../sub/", "--cache", "list"}).exitCode, 0);
    const auto host = buildFolder / "bin" / (std::wstring(L"recordedHost") + MZ_PROGRAM_EXTENSION);
    EXPECT_EQ(runProgram(host, host.string(), {inWork("list"), sub.string()}, work.path()).output,
              "1 builders, 0 mapped, no word\n1 made\n");
}

TEST_F(Command, ScanTellsWhatItDid) {
    add(L"goodWithKit", "a");
    add(L"crashesInEntryPoint", "b");
    const std::string list = inWork("list"), file = (folder.path() / "b").string();
    const Json first = json(1, {"scan", "--cache", list});
    EXPECT_EQ(first.at("files").at(0).at("verdict"), "works");
    EXPECT_EQ(first.at("files").at(1).at("verdict"), "crashed");
    EXPECT_TRUE(first.at("files").at(1).at("recorded").get<bool>());
    const Json second = json(1, {"scan", "--cache", list});
    EXPECT_FALSE(second.at("files").at(0).at("looked").get<bool>());
    EXPECT_FALSE(second.at("files").at(1).at("looked").get<bool>());
    EXPECT_TRUE(json(1, {"scan", "--retry", "--cache", list}).at("files").at(1).at("looked"));
    EXPECT_THAT(run({"scan", "--path", path(), "--cache", list}).output,
                HasSubstr("2 files: 1 with builders, 1 with faults, 0 others; 0 looked at, 2 "
                          "recorded\n"));
    EXPECT_EQ(json(1, {"list", "--cache", list}).at("files").size(), 2u);
    EXPECT_EQ(json(1, {"explain", file, "--cache", list}).at("files").at(0).at("verdict"),
              "component");
}

TEST_F(Command, ScanTellsWhatItFoundThoughItCannotWrite) {
    add(L"goodWithKit");
    const Json result = json(1, {"scan", "--cache", inWork("no/list")});
    EXPECT_EQ(result.at("files").at(0).at("verdict"), "works");
    EXPECT_NE(result.at("notWritten"), "");
}

TEST_F(Command, ShowsControlCharactersInsteadOfSendingThem) {
    add(L"throwsInExtensions");
    const ProgramResult result = run({"types", "--path", path()});
    EXPECT_THAT(result.output, HasSubstr("\\x1B[31mred\\x0Asecond line\n"));
    EXPECT_EQ(std::count(result.output.begin(), result.output.end(), '\n'), 1);
}

TEST_F(Command, LeavesStandardOutputToItsResults) {
    add(L"notes");
    add(L"talkativeImporter");
    EXPECT_EQ(json(0, {"types"}).at("types").size(), 2u);
    EXPECT_EQ(json(0, {"graph"}).at("libraries").size(), 2u);
    std::ofstream(work.path() / "other", std::ios::binary) << "x";
    EXPECT_EQ(json(1, {"import", "other"}).at("files").size(), 1u);
    EXPECT_EQ(run({"types", "--path", path()}).output,
              "notes                 *.note            Notes\n"
              "talks                 *.talk            Talks\n");
}

TEST_F(Command, EveryCommandThatLoadsLibrariesTakesTheLimits) {
    add(L"eatsMemory");
    add(L"notes");
    const Json files = json(1, {"scan", "--cache", "list", "--memory-limit", "100"}).at("files");
    EXPECT_EQ(files.at(0).at("sentence"), "it uses more memory in enumerateBuilders than the 100 "
                                          "MiB allowed; --memory-limit allows more");
    EXPECT_EQ(json(1, {"types", "--memory-limit", "100"}).at("types").size(), 1u);
    EXPECT_EQ(json(1, {"graph", "--memory-limit", "100"}).at("libraries").size(), 1u);
    std::ofstream(work.path() / "one.note", std::ios::binary) << "N1";
    const auto limited = {"--memory-limit", "100", "--time-limit", "60"};
    std::vector<std::string> import{"import", "one.note", "--save", inWork("saved")};
    import.insert(import.end(), limited.begin(), limited.end());
    EXPECT_TRUE(json(1, import).at("files").at(0).at("imported"));
    std::vector<std::string> show{"show", inWork("saved")};
    show.insert(show.end(), limited.begin(), limited.end());
    EXPECT_EQ(json(1, show).at("objects").size(), 5u);
}

TEST_F(Command, GoesOnWhateverAComponentThrows) {
    add(L"notes");
    add(L"throwsInCanImport");
    add(L"throwsInExtensions");
    for (const char* name : {"a.note", "[1].note", "b"})
        std::ofstream(work.path() / name, std::ios::binary) << "N1";
    EXPECT_EQ(json(0, {"types"}).at("types").size(), 3u);
    const std::string tooLong(5000, 'x');
    const Json files = json(1, {"import", "a.note", tooLong, "[1].note", "b"}).at("files");
    ASSERT_EQ(files.size(), 4u);
    EXPECT_EQ(files[0].at("builderName"), "notes");
    EXPECT_EQ(files[1].at("object"), "there is no such file");
    EXPECT_EQ(files[2].at("builderName"), "notes");
    EXPECT_EQ(files[3].at("builderName"), "notes");
    std::filesystem::remove(folder.path() / builtComponent(L"notes").filename());
    EXPECT_THAT(json(1, {"import", "a.note"}).at("files").at(0).at("object").get<std::string>(),
                HasSubstr("no exception of any known kind"));
}

TEST_F(Command, EndsWithOneWhenAComponentExits) {
    add(L"notes");
    add(L"exitsInImport");
    std::ofstream(work.path() / "one.note", std::ios::binary) << "N1";
    std::ofstream(work.path() / "two.exit", std::ios::binary) << "E";
    const ProgramResult lines = run({"import", "one.note", "two.exit", "--path", path()});
    EXPECT_EQ(lines.exitCode, 1);
    EXPECT_THAT(lines.output, StartsWith("one.note: imported through \"notes\""));
    EXPECT_EQ(run({"import", "one.note", "two.exit", "--path", path(), "--json"}).exitCode, 1);
    EXPECT_EQ(run({"import", "one.note", "two.exit", "--path", path(), "--save", "saved"}).exitCode,
              1);
    EXPECT_FALSE(std::filesystem::exists(work.path() / "saved"));
    EXPECT_EQ(run({"graph", "--path", path()}).exitCode, 1);
    EXPECT_EQ(run({"types", "--path", path()}).exitCode, 0);
}

TEST_F(Command, ImportsInChildProcesses) {
    // The component manager records the folder in lower case.
    const std::filesystem::path components = work.path() / "Plug-Ins" / "Of The Host";
    std::filesystem::create_directories(components);
    for (const wchar_t* component : {L"notes", L"exitsInImport"}) {
        const std::filesystem::path file = builtComponent(component);
        std::filesystem::copy_file(file, components / file.filename());
    }
    std::ofstream(work.path() / "one.note", std::ios::binary) << "N1";
    std::ofstream(work.path() / "two.exit", std::ios::binary) << "E";
    const ProgramResult lines = run({"import", "one.note", "two.exit", "--guarded", "--path",
                                     "Plug-Ins/Of The Host", "--save", "saved"});
    EXPECT_EQ(lines.exitCode, 1);
    EXPECT_THAT(lines.output, StartsWith("one.note: imported through \"Notes\""));
    EXPECT_FALSE(std::filesystem::exists(work.path() / "saved"));
    const ProgramResult json = run({"import", "one.note", "two.exit", "--guarded", "--path",
                                    "Plug-Ins/Of The Host", "--json"});
    const auto files = Json::parse(json.output).at("files");
    EXPECT_EQ(files.at(0).at("verdict"), "imported");
    EXPECT_EQ(files.at(1).at("verdict"), "exited");
    EXPECT_THAT(files.at(1).at("object").get<std::string>(),
                HasSubstr("the import by \"Exits\" ended its process with status 0"));
    EXPECT_EQ(run({"import", "one.note", "--guarded", "--path", "Plug-Ins/Of The Host", "--save",
                   "saved"})
                  .exitCode,
              0);
    EXPECT_TRUE(std::filesystem::exists(work.path() / "saved"));
}

TEST_F(Command, UsesTheOthersBesideALibraryThatNeedsItsHost) {
    add(L"notes");
    add(L"takesFromHost");
    EXPECT_EQ(json(1, {"types"}).at("types").size(), 1u);
}

TEST_F(Command, EndsWithOneWhereALibraryIsFaulty) {
    add(L"notes");
    add(L"crashesInEntryPoint");
    std::ofstream(work.path() / "one.note", std::ios::binary) << "N1";
    EXPECT_EQ(json(1, {"types"}).at("types").size(), 1u);
    EXPECT_EQ(json(1, {"graph"}).at("libraries").size(), 1u);
    // What was asked for is done all the same.
    const Json files = json(1, {"import", "one.note", "--save", inWork("saved")}).at("files");
    EXPECT_TRUE(files.at(0).at("imported"));
    EXPECT_TRUE(std::filesystem::exists(work.path() / "saved"));
    EXPECT_EQ(json(1, {"show", inWork("saved")}).at("objects").size(), 5u);
}

TEST_F(Command, TakesNamesInBracketsAsTheyAre) {
    EXPECT_EQ(json(1, {"explain", "[a,b]"}).at("files").size(), 1u);
    const auto file = json(1, {"explain", "[x]"}).at("files").at(0).at("file").get<std::string>();
    EXPECT_TRUE(file.ends_with("[x]")) << file;
}

TEST_F(Command, OverwritesNothingThatItReadsOrThatIsNoFile) {
    add(L"notes");
    std::ofstream(work.path() / "one.note", std::ios::binary) << "N1";
    EXPECT_EQ(run({"import", "one.note", "--path", path(), "--save", "./one.note"}).exitCode, 2);
    EXPECT_EQ(contentOf(work.path() / "one.note"), "N1");
    EXPECT_EQ(run({"import", "one.note", "--path", path(), "--save", path()}).exitCode, 1);
    EXPECT_EQ(run({"graph", "--path", path(), "--output", path()}).exitCode, 1);
}

TEST_F(Command, LoadsNothingThatWasNotTried) {
    // Where letter case counts, only one of two such names can be recorded.
    add(L"notes", "B");
    add(L"crashesInInitialiser", "b");
    EXPECT_TRUE(run({"types", "--path", path()}).finished);
    // Where it does not, some names have no form in the locale.
    std::filesystem::remove(folder.path() / "b");
    add(L"crashesInInitialiser", u8"\u4E2D");
    EXPECT_TRUE(run({"types", "--path", path()}).finished);
    // Nor has a search path a form for some folders: this one would lead to another.
    const auto strange = work.path() / "a;b";
    for (const auto& inside : {strange, work.path() / "a"}) {
        std::filesystem::create_directory(inside);
        std::filesystem::copy_file(builtComponent(L"crashesInInitialiser"), inside / "x");
    }
    const auto program =
        buildFolder / "bin" / (std::wstring(L"mzcomponents") + MZ_PROGRAM_EXTENSION);
    const ProgramResult result = runProgram(program, program.string(), {"types"}, strange);
    EXPECT_TRUE(result.finished);
    EXPECT_EQ(result.exitCode, 1);
}

TEST_F(Command, EndsWithOneWhereAFolderCannotBeSearched) {
    add(L"notes");
    for (const char* command : {"types", "graph"}) {
        EXPECT_EQ(run({command, "--path", path() + "-not-there"}).exitCode, 1) << command;
        EXPECT_EQ(run({command, "--path", path() + ";" + path() + "-not-there"}).exitCode, 1);
    }
}

TEST_F(Command, TypesListsWhatComponentsImport) {
    add(L"notes");
    const Json types = json(0, {"types"}).at("types");
    ASSERT_EQ(types.size(), 1u);
    EXPECT_EQ(types[0].at("name"), "notes");
    EXPECT_EQ(types[0].at("extensions"), Json::array({"note"}));
    EXPECT_EQ(run({"types", "--path", path()}).output,
              "notes                 *.note            Notes\n");
}

TEST_F(Command, ImportsStoresAndShowsObjects) {
    add(L"notes");
    std::ofstream(work.path() / "one.note", std::ios::binary) << "N1";
    std::ofstream(work.path() / "other", std::ios::binary) << "x";
    const Json entry = json(0, {"import", "one.note", "--save", inWork("saved")}).at("files").at(0);
    EXPECT_EQ(entry.at("builderName"), "notes");
    EXPECT_THAT(entry.at("object").get<std::string>(), HasSubstr("version 7"));

    const Json objects = json(0, {"show", inWork("saved")}).at("objects");
    // Number, class, version and value come first; the object inside is then stored once.
    ASSERT_EQ(objects.size(), 5u);
    EXPECT_EQ(objects[0].at("begin"), 0);
    EXPECT_EQ(objects[0].at("end"), std::filesystem::file_size(work.path() / "saved"));
    EXPECT_EQ(objects[1].at("begin"), 28);
    EXPECT_EQ(objects[1].at("depth"), 1);
    EXPECT_EQ(objects[2].at("object"), "null");
    EXPECT_THAT(objects[4].at("object").get<std::string>(), StartsWith("again: "));

    EXPECT_EQ(json(1, {"import", "other"}).at("files").at(0).at("object"),
              "no builder imports this file");
    EXPECT_EQ(json(1, {"import", "missing.note"}).at("files").at(0).at("object"),
              "there is no such file");
    std::filesystem::resize_file(work.path() / "saved", 60);
    EXPECT_EQ(run({"show", inWork("saved"), "--path", path()}).exitCode, 1);
}

TEST_F(Command, ShowsAListWithPositions) {
    add(L"goodWithKit", "a");
    run({"scan", "--path", path(), "--cache", inWork("list")});
    const Json shown = json(0, {"show", inWork("list")});
    EXPECT_EQ(shown.at("kind"), "recordedList");
    EXPECT_EQ(shown.at("libraries").at(0).at("position"), 4);
    EXPECT_EQ(shown.at("libraries").at(0).at("fileName"), "a");
    EXPECT_EQ(shown.at("libraries").at(0).at("builders").at(0).at("name"), "kit");
    EXPECT_EQ(run({"show", inWork("missing")}).exitCode, 1);
    std::filesystem::resize_file(work.path() / "list", 60);
    const ProgramResult cut = run({"show", inWork("list"), "--path", path()});
    EXPECT_EQ(cut.exitCode, 1);
    EXPECT_EQ(cut.output, "");
    std::ofstream(work.path() / "foreign") << "some text that is nothing of ours";
    EXPECT_EQ(run({"show", inWork("foreign"), "--path", path()}).exitCode, 1);
}

TEST_F(Command, DrawsLibrariesAndBuilders) {
    add(L"notes", "a");
    add(L"goodWithKit", "b");
    const ProgramResult dot = run({"graph", "--path", path()});
    EXPECT_EQ(dot.exitCode, 0);
    EXPECT_THAT(dot.output, StartsWith("digraph components {\n"));
    EXPECT_THAT(dot.output, HasSubstr("label=\"Notes\""));
    EXPECT_THAT(dot.output, HasSubstr("label=\"kit\""));
    EXPECT_EQ(run({"graph", "--path", path(), "--output", inWork("dot")}).output, "");
    EXPECT_EQ(contentOf(work.path() / "dot"), dot.output);
    EXPECT_EQ(json(0, {"graph"}).at("libraries").size(), 2u);
    // Graphviz is not everywhere; where it is not, that is said.
    const ProgramResult drawn = run({"graph", "--path", path(), "--svg", inWork("svg")});
    EXPECT_EQ(drawn.exitCode, std::filesystem::exists(work.path() / "svg") ? 0 : 1);
}

TEST_F(Command, TakesNamesWithBlanks) {
    const auto folderWithBlank = work.path() / "with blank";
    std::filesystem::create_directory(folderWithBlank);
    std::filesystem::copy_file(builtComponent(L"goodWithKit"), folderWithBlank / "a b");
    const ProgramResult result = run({"explain", "--load", (folderWithBlank / "a b").string()});
    EXPECT_EQ(result.exitCode, 0) << result.output;
}

TEST_F(Command, EndsWellWithALibraryThatLogsWhileItIsUnloaded) {
    add(L"logsAtEnd");
    std::ofstream(work.path() / "one.last", std::ios::binary) << "x";
    for (const char* command : {"types", "graph"})
        EXPECT_EQ(run({command, "--path", path()}).exitCode, 0) << command;
    EXPECT_EQ(run({"import", "one.last", "--path", path()}).exitCode, 1);
}

TEST_F(Command, ListAndScanNameTheLibraryThatWinsABuilder) {
    add(L"sharesUidFirst", "a");
    add(L"sharesUidSecond", "b");
    for (int round = 0; round < 2; ++round) {
        const Json files = json(0, {"scan", "--cache", inWork("list")}).at("files");
        EXPECT_EQ(files.at(0).at("verdict"), "uidTaken");
        EXPECT_TRUE(files.at(0).at("recorded").get<bool>());
        EXPECT_THAT(files.at(0).at("sentence").get<std::string>(), HasSubstr("\\b too, which"));
        EXPECT_EQ(files.at(1).at("verdict"), "works");
        EXPECT_EQ(files.at(1).at("notes").at(0).at("verdict"), "uidWins");
    }
    const Json listed = json(0, {"list", "--cache", inWork("list")}).at("files");
    EXPECT_EQ(listed.at(0).at("verdict"), "uidTaken");
    EXPECT_EQ(listed.at(1).at("verdict"), "component");
    const ProgramResult scanned = run({"scan", "--path", path(), "--cache", inWork("list")});
    EXPECT_THAT(scanned.output, HasSubstr("\\b too, which comes later and wins\n"));
    EXPECT_THAT(scanned.output, HasSubstr("2 files: 2 with builders, 0 with faults"));
}

TEST_F(Command, HelpSaysWhatThePagesSay) {
    const ProgramResult verdict = run({"help", "dependencyMissing"});
    EXPECT_EQ(verdict.exitCode, 0);
    EXPECT_THAT(verdict.output, StartsWith("dependencyMissing\n\n"));
    EXPECT_THAT(verdict.output, HasSubstr("\nRemedy: "));
    EXPECT_THAT(verdict.output, HasSubstr("\n    $ mzcomponents explain"));
    EXPECT_THAT(verdict.output, Not(AnyOf(HasSubstr("<!--"), HasSubstr("**"), HasSubstr("]("))));
    EXPECT_EQ(run({"help", "DEPENDENCYMISSING"}).output, verdict.output);
    EXPECT_THAT(run({"help", "uid-not-nil"}).output, StartsWith("uid-not-nil (error)\n\n"));
    const std::string byReason = run({"help", "Error reading stream"}).output;
    EXPECT_THAT(byReason, StartsWith("Error reading stream. (ExReadError)\n\n"));
    EXPECT_THAT(run({"help", "ExReadError"}).output, HasSubstr(byReason));
}

TEST_F(Command, HelpHasEachVerdictAndEachRule) {
    const std::string topics = run({"help"}).output;
    for (const char* topic : {"\n  component\n", "\n  endUnknown\n", "\n  uid-free (error)\n",
                              "\n  Bad swap bytes size. (ExBadSwapSize)\n"})
        EXPECT_THAT(topics, HasSubstr(topic));
    EXPECT_EQ(run({"help", "nonsense"}).exitCode, 2);
}

TEST_F(Command, ExplainSaysWhetherASearchPathLeadsToTheFile) {
    const std::string file = add(L"goodWithKit").string();
    const auto noteOf = [](const Json& result) {
        return result.at("files").at(0).at("notes").at(0).at("verdict").get<std::string>();
    };
    EXPECT_EQ(noteOf(json(0, {"explain", file})), "onPath");
    const ProgramResult elsewhere =
        run({"explain", file, "--json", "--path", work.path().string()});
    EXPECT_EQ(elsewhere.exitCode, 1);
    EXPECT_EQ(noteOf(Json::parse(elsewhere.output)), "notOnPath");
    const ProgramResult without = run({"explain", file, "--json"});
    EXPECT_EQ(without.exitCode, 0);
    EXPECT_TRUE(Json::parse(without.output).at("files").at(0).at("notes").empty());
    EXPECT_EQ(run({"explain", file, "--path", ";"}).exitCode, 2);
    // A file that is no library belongs on no path.
    const std::string text = work.write("notes.txt", "text").string();
    const ProgramResult other = run({"explain", text, "--json", "--path", path()});
    EXPECT_TRUE(Json::parse(other.output).at("files").at(0).at("notes").empty());
}

TEST_F(Command, AFileAsASearchPathIsCalledThat) {
    const std::string file = add(L"goodWithKit").string();
    const ProgramResult result = run({"list", "--json", "--path", file});
    EXPECT_EQ(result.exitCode, 1);
    EXPECT_EQ(Json::parse(result.output).at("files").at(0).at("verdict"), "notAFolder");
}

} // namespace
