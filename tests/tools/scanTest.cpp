// SPDX-License-Identifier: BSL-1.0
#include "tests/tools/toolsFixture.h"

#include "components/componentManager/utf8.h"

#include <chrono>
#include <clocale>
#include <fstream>
#include <map>
#include <thread>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::HasSubstr;

namespace {

class Scan : public ToolsTest {
  protected:
    std::filesystem::path list() const { return lists.path() / "list"; }

    ScanOptions options() const {
        ScanOptions wanted;
        wanted.folders = {folder.path()};
        wanted.list = list();
        wanted.probe = patient();
        return wanted;
    }

    /// Verdicts by the name of the file, as the system spells it.
    static std::map<std::string, Verdict> verdicts(const ScanResult& result) {
        std::map<std::string, Verdict> all;
        for (const ScannedFile& file : result.files)
            all[file.path.filename().string()] = file.verdict.verdict;
        return all;
    }

    static int looked(const ScanResult& result) {
        int count = 0;
        for (const ScannedFile& file : result.files)
            count += file.looked;
        return count;
    }

    std::string runHost(const std::filesystem::path& searched) {
        const auto program =
            buildFolder / "bin" / (std::wstring(L"recordedHost") + MZ_PROGRAM_EXTENSION);
        const ProgramResult result = runProgram(program, program.string(),
                                                {list().string(), searched.string()}, lists.path());
        return (result.finished && result.exitCode == 0 ? "" : "failed: ") + result.output;
    }

    void addNumbered() {
        for (int number = 10; number < 40; ++number) {
            const auto file = builtComponent(L"numbered" + std::to_wstring(number), L"numbered");
            std::filesystem::copy_file(file, folder.path() / file.filename());
        }
    }

    TemporaryDirectory lists;
};

TEST_F(Scan, OfAHostileFolderEndsAndRecordsTheGoodLibrariesWithTheTrueVerdictOnEveryOther) {
    addNumbered();
    const std::map<std::wstring, Verdict> faults = {
        {L"crashesInInitialiser", Verdict::crashed},
        {L"crashesInEntryPoint", Verdict::crashed},
        {L"crashesInEnumerate", Verdict::crashed},
        {L"aborts", Verdict::aborted},
        {L"exits", Verdict::exited},
        {L"loopsForever", Verdict::timedOut},
        {L"eatsMemory", Verdict::outOfMemory},
        {L"offersForever", Verdict::outOfMemory},
        {L"missesDependency", Verdict::dependencyMissing},
        {L"noEntryPoint", Verdict::noEntryPoint},
        {L"dataEntryPoint", Verdict::entryPointNoFunction},
        {L"nullDescription", Verdict::nullDescription},
        {L"wrongInterface", Verdict::wrongInterface},
        {L"throwsInEntryPoint", Verdict::threw},
        {L"throwsInEnumerate", Verdict::threw},
        {L"offersNull", Verdict::wrongItem},
    };
    for (const auto& [name, verdict] : faults)
        add(name);
    folder.write("text.txt", "no library");
    const std::string good = contentOf(builtComponent(L"goodByHand"));
    folder.write("processor", forOtherProcessor(good));
    folder.write("cut", good.substr(0, good.size() / 2));

    ScanOptions wanted = options();
    wanted.probe.timeLimit = std::chrono::seconds(15);
    wanted.probe.memoryLimit = std::uint64_t{300} << 20;
    const ScanResult result = scan(wanted);

    std::map<std::string, Verdict> all = verdicts(result);
    for (const auto& [name, verdict] : faults) {
        const std::filesystem::path file = name + MZ_LIBRARY_EXTENSION;
        EXPECT_EQ(all[file.string()], verdict) << file;
    }
    EXPECT_EQ(all["text.txt"], Verdict::notALibrary);
    EXPECT_EQ(all["processor"], Verdict::otherProcessor);
    EXPECT_EQ(all["cut"], Verdict::damaged);
    int works = 0;
    for (const auto& [name, verdict] : all)
        works += verdict == Verdict::works;
    EXPECT_EQ(works, 30);
    EXPECT_EQ(result.libraries.size(), 30 + faults.size() + 3);

    const ListReading reading = readRecordedList(list());
    ASSERT_EQ(reading.state, ListReading::State::good);
    EXPECT_EQ(reading.libraries.size(), result.libraries.size());
    // A host that starts with the list runs none of them: it neither maps a file nor hears a word.
    EXPECT_EQ(runHost(folder.path()), "30 builders, 0 mapped, no word\n30 made\n");

    // Nothing but what may have been mended from outside is looked at again.
    const ScanResult second = scan(wanted);
    EXPECT_EQ(looked(second), 1);
    EXPECT_EQ(verdicts(second), verdicts(result));
}

TEST_F(Scan, WritesWhatTheManagerItselfWouldWrite) {
    // The manager of this process, which must not meet a library that takes it down.
    add(L"goodWithKit");
    add(L"noEntryPoint");
    folder.write("text", "no library");
    scan(options());
    EXPECT_EQ(runHost(folder.path()), "1 builders, 0 mapped, no word\n1 made\n");
}

TEST_F(Scan, RecordsALibraryForAnotherAbiSoThatNoHostLoadsIt) {
    const auto file = add(L"stampedOtherVersion");
    add(L"goodWithKit");
    // The second scan reads the stamp again: libMZcomponentManager may be another one then.
    for (int round = 0; round < 2; ++round) {
        const ScanResult result = scan(options());
        EXPECT_EQ(verdicts(result)[file.filename().string()], Verdict::otherAbi);
        EXPECT_EQ(looked(result), round == 0 ? 2 : 1);
        const ListReading reading = readRecordedList(list());
        ASSERT_EQ(reading.libraries.size(), 2u);
        const RecordedLibrary& recorded = reading.libraries[1];
        EXPECT_TRUE(recorded.builders.empty());
        EXPECT_EQ(recorded.size, static_cast<std::int64_t>(std::filesystem::file_size(file)));
        EXPECT_NE(recorded.time, 0u);
        ASSERT_TRUE(recorded.kept);
        EXPECT_EQ(recorded.kept->verdict, Verdict::otherAbi);
    }
    EXPECT_EQ(runHost(folder.path()), "1 builders, 0 mapped, no word\n1 made\n");
}

TEST_F(Scan, DropsTheBuildersOfALibraryThatWasRecordedUnderAnotherAbi) {
    add(L"stampedOtherVersion");
    ScanResult first = scan(options());
    ASSERT_EQ(first.libraries.size(), 1u);
    // As another version of libMZcomponentManager wrote it.
    first.libraries[0].builders.push_back({goodUid, L"stamped", L"", L""});
    first.libraries[0].kept.reset();
    writeRecordedList(list(), first.libraries);
    const ScanResult result = scan(options());
    EXPECT_EQ(result.files[0].verdict.verdict, Verdict::otherAbi);
    EXPECT_TRUE(result.libraries[0].builders.empty());
    EXPECT_TRUE(readRecordedList(list()).libraries[0].builders.empty());
}

TEST_F(Scan, FollowsTheInterfacesOfTheHostThoughTheLibraryIsUnchanged) {
    add(L"changedInterface");
    ScanOptions wanted = options();
    const auto verdictIs = [&](Verdict verdict) {
        const ScanResult result = scan(wanted);
        ASSERT_EQ(result.files.size(), 1u);
        EXPECT_EQ(result.files[0].verdict.verdict, verdict);
        EXPECT_EQ(result.libraries[0].builders.size(), verdict == Verdict::works ? 1u : 0u);
        const ListReading reading = readRecordedList(list());
        ASSERT_EQ(reading.libraries.size(), 1u);
        EXPECT_EQ(reading.libraries[0].builders.size(), verdict == Verdict::works ? 1u : 0u);
        if (verdict != Verdict::works) {
            EXPECT_EQ(reading.libraries[0].kept.value_or(Finding{}).verdict, verdict);
        }
    };
    verdictIs(Verdict::works);
    wanted.hosts = {folder.path() / "missing", hostWithInterfaces()};
    verdictIs(Verdict::otherInterface);
    verdictIs(Verdict::otherInterface);
    wanted.hosts = {builtComponent(L"changedInterface")};
    verdictIs(Verdict::works);
    wanted.hosts = {hostWithInterfaces()};
    verdictIs(Verdict::otherInterface);
}

TEST_F(Scan, ComparesALibraryThatAHostHasRecordedSince) {
    add(L"goodWithKit");
    ScanOptions wanted = options();
    wanted.hosts = {hostWithInterfaces()};
    ScanResult first = scan(wanted);
    ASSERT_EQ(first.libraries.size(), 1u);
    // A host that loads a library does not compare its interfaces.
    const auto file = add(L"changedInterface");
    ScanOptions byHost = options();
    const RecordedLibraries both = scan(byHost).libraries;
    ASSERT_EQ(both.size(), 2u);
    scan(wanted); // Leaves a digest, and no builders of the second library.
    writeRecordedList(list(), both);
    const ScanResult result = scan(wanted);
    EXPECT_EQ(verdicts(result)[file.filename().string()], Verdict::otherInterface);
    EXPECT_EQ(readRecordedList(list()).libraries.size(), 2u);
}

TEST_F(Scan, ComparesAgainAfterTheHostWasReplacedByAFileOfItsSize) {
    add(L"changedInterface");
    TemporaryDirectory hosts;
    const std::filesystem::path host = hosts.path() / "host";
    auto time = std::filesystem::file_time_type::clock::now();
    const auto putHost = [&](const std::filesystem::path& from) {
        std::filesystem::copy_file(from, host, std::filesystem::copy_options::overwrite_existing);
        std::filesystem::resize_file(host, std::uintmax_t{4} << 20);
        // Times have whole seconds in the standard library of MinGW.
        std::filesystem::last_write_time(host, time += std::chrono::seconds(2));
    };
    ScanOptions wanted = options();
    wanted.hosts = {host};
    putHost(builtComponent(L"changedInterface"));
    EXPECT_EQ(scan(wanted).files[0].verdict.verdict, Verdict::works);
    EXPECT_EQ(scan(wanted).files[0].verdict.verdict, Verdict::works);
    putHost(hostWithInterfaces());
    EXPECT_EQ(scan(wanted).files[0].verdict.verdict, Verdict::otherInterface);
}

TEST_F(Scan, LeavesOutALibraryThatNeedsItsHostSoThatTheHostLoadsIt) {
    const auto file = add(L"takesFromHost");
    add(L"goodWithKit");
    for (int round = 0; round < 2; ++round) {
        const ScanResult result = scan(options());
        EXPECT_EQ(verdicts(result)[file.filename().string()], Verdict::needsHost) << round;
        ASSERT_EQ(result.libraries.size(), 1u);
        ASSERT_EQ(result.unjudged.size(), 1u);
        EXPECT_TRUE(result.unjudged[0].builders.empty());
        EXPECT_EQ(readRecordedList(list()).libraries.size(), 1u);
    }
    const std::string host = runHost(folder.path());
    EXPECT_THAT(host, ::testing::StartsWith("2 builders, 1 mapped"));
    EXPECT_THAT(host, HasSubstr("\n2 made\n"));
}

TEST_F(Scan, LooksAgainAtALibraryThatChanged) {
    const auto file = add(L"changingOne", "changing");
    EXPECT_EQ(looked(scan(options())), 1);
    EXPECT_EQ(looked(scan(options())), 0);
    std::ofstream(file, std::ios::binary | std::ios::app) << "more";
    EXPECT_EQ(looked(scan(options())), 1);
    EXPECT_EQ(looked(scan(options())), 0);
}

TEST_F(Scan, TriesALibraryAgainWhoseDependencyWasMissing) {
    add(L"missesDependency");
    EXPECT_EQ(verdicts(scan(options())).begin()->second, Verdict::dependencyMissing);
    EXPECT_EQ(looked(scan(options())), 1);
}

TEST_F(Scan, TriesAFailureAgainOnlyWhenTold) {
    add(L"crashesInEntryPoint");
    EXPECT_EQ(looked(scan(options())), 1);
    EXPECT_EQ(looked(scan(options())), 0);
    ScanOptions retrying = options();
    retrying.retry = true;
    EXPECT_EQ(looked(scan(retrying)), 1);
}

TEST_F(Scan, TriesARecordWithoutBuildersThatSomebodyElseWrote) {
    add(L"goodWithKit");
    ScanResult first = scan(options());
    first.libraries[0].builders.clear();
    writeRecordedList(list(), first.libraries);
    std::filesystem::remove(verdictsFileOf(list()));
    EXPECT_EQ(verdicts(scan(options())).begin()->second, Verdict::works);
}

TEST_F(Scan, RejectsADamagedListWholeAndBuildsItAnew) {
    add(L"goodWithKit");
    std::ofstream(list(), std::ios::binary) << "something else";
    const ScanResult result = scan(options());
    EXPECT_THAT(result.rejected, HasSubstr(L"byte"));
    EXPECT_EQ(looked(result), 1);
    EXPECT_EQ(readRecordedList(list()).state, ListReading::State::good);
    EXPECT_EQ(contentOf(result.keptAs), "something else");
    EXPECT_EQ(scan(options()).rejected, L"");
}

TEST_F(Scan, TakesAnEmptyFileForADamagedListThatNeedsNoCopy) {
    add(L"goodWithKit");
    lists.write("list", "");
    const ScanResult result = scan(options());
    EXPECT_NE(result.rejected, L"");
    EXPECT_EQ(result.keptAs, std::filesystem::path());
    EXPECT_EQ(result.notWritten, L"");
    EXPECT_FALSE(std::filesystem::exists(lists.path() / "list.rejected"));
    EXPECT_EQ(readRecordedList(list()).libraries.size(), 1u);
}

TEST_F(Scan, ReplacesNoDamagedListOfWhichItCannotKeepACopy) {
    add(L"goodWithKit");
    lists.write("list", "something else");
    std::filesystem::create_directory(lists.path() / "list.rejected");
    const ScanResult result = scan(options());
    EXPECT_EQ(result.notWritten, displayName(list()) + L": nothing was written, for what is there "
                                                       L"could not be kept");
    EXPECT_EQ(result.keptAs, std::filesystem::path());
    EXPECT_EQ(result.libraries.size(), 1u);
    EXPECT_EQ(contentOf(list()), "something else");
    EXPECT_FALSE(std::filesystem::exists(verdictsFileOf(list())));
}

TEST_F(Scan, KeepsTheRecordOfALibraryThatItWouldTryAgainWhereThereIsNoProbe) {
    add(L"goodWithKit");
    ScanResult first = scan(options());
    first.libraries[0].builders.clear();
    writeRecordedList(list(), first.libraries); // As a host that could not load it.
    std::filesystem::remove(verdictsFileOf(list()));
    ScanOptions wanted = options();
    wanted.probe.program = folder.path() / "no-probe";
    const ScanResult result = scan(wanted);
    ASSERT_EQ(result.files.size(), 1u);
    EXPECT_EQ(result.files[0].verdict.verdict, Verdict::probeFailed);
    EXPECT_TRUE(result.files[0].recorded);
    ASSERT_EQ(result.libraries.size(), 1u);
    EXPECT_EQ(result.libraries[0].time, first.libraries[0].time);
    EXPECT_TRUE(result.libraries[0].builders.empty());
}

TEST_F(Scan, RecordsNothingWhereThereIsNoProbe) {
    add(L"goodWithKit");
    scan(options());
    const std::string before = contentOf(list());
    add(L"countedDescription");
    ScanOptions wanted = options();
    wanted.probe.program = folder.path() / "no-probe";
    const ScanResult result = scan(wanted);
    EXPECT_EQ(verdicts(result)[add(L"goodWithKit").filename().string()], Verdict::works);
    EXPECT_EQ(verdicts(result)[add(L"countedDescription").filename().string()],
              Verdict::probeFailed);
    EXPECT_EQ(result.libraries.size(), 1u);
    EXPECT_NE(result.notWritten, L"");
    EXPECT_EQ(contentOf(list()), before);
}

TEST_F(Scan, WritesTheListWhereItsVerdictsCannotBeWritten) {
    add(L"goodWithKit");
    std::filesystem::create_directory(verdictsFileOf(list()));
    EXPECT_NE(scan(options()).notWritten, L"");
    EXPECT_EQ(readRecordedList(list()).libraries.size(), 1u);
}

TEST_F(Scan, LeavesNoVerdictsBesideAListThatCannotBeWritten) {
    add(L"crashesInEntryPoint");
    std::filesystem::create_directory(list());
    EXPECT_NE(scan(options()).notWritten, L"");
    EXPECT_FALSE(std::filesystem::exists(verdictsFileOf(list())));
}

TEST_F(Scan, BelievesNoVerdictThatNoScanCanHaveKept) {
    add(L"crashesInEntryPoint");
    scan(options());
    std::string kept = contentOf(verdictsFileOf(list()));
    const std::string word = "\"crashed\"";
    for (const char* lie : {"\"works\"", "\"component\"", "\"notRecorded\"", "\"missing\""}) {
        std::string changed = kept;
        changed.replace(changed.find(word), word.size(), lie);
        std::ofstream(verdictsFileOf(list()), std::ios::binary) << changed;
        const ScanResult result = scan(options());
        EXPECT_EQ(verdicts(result).begin()->second, Verdict::crashed) << lie;
        EXPECT_EQ(looked(result), 1) << lie;
    }
}

TEST_F(Scan, LeavesVerdictsToTheFileThatTheyAreAbout) {
    add(L"crashesInEntryPoint");
    const RecordedLibraries scanned = scan(options()).libraries;
    ASSERT_EQ(scanned.size(), 1u);
    const auto keptOf = [&](const RecordedLibrary& library) {
        writeRecordedList(list(), {library}); // As a host that met another file.
        return readRecordedList(list()).libraries.at(0).kept;
    };
    ASSERT_TRUE(keptOf(scanned[0]));
    EXPECT_EQ(keptOf(scanned[0])->verdict, Verdict::crashed);
    RecordedLibrary other = scanned[0];
    other.time += 2;
    EXPECT_FALSE(keptOf(other));
    other = scanned[0];
    other.size += 1;
    EXPECT_FALSE(keptOf(other));
    other = scanned[0];
    other.fileName += L"x";
    EXPECT_FALSE(keptOf(other));
}

TEST_F(Scan, LeavesOutFoldersThatCannotBeSearched) {
    const auto strange = folder.path() / "a;b", closed = folder.path() / "closed";
    std::filesystem::create_directory(strange);
    std::filesystem::create_directory(closed);
    std::filesystem::permissions(closed, std::filesystem::perms::none);
    ScanOptions wanted = options();
    wanted.folders = {strange, closed};
    const ScanResult result = scan(wanted);
    ASSERT_FALSE(result.files.empty());
    EXPECT_EQ(result.files[0].verdict.verdict, Verdict::notSearchable);
    EXPECT_TRUE(result.files[0].folder);
    EXPECT_EQ(Tools::searchPathOf(std::vector{strange}), L"");
    // Some users, and some systems, may read everything.
    std::error_code failure;
    if (std::filesystem::directory_iterator(closed, failure); failure) {
        ASSERT_EQ(result.files.size(), 2u);
        EXPECT_EQ(result.files[1].verdict.verdict, Verdict::unreadable);
    }
    std::filesystem::permissions(closed, std::filesystem::perms::owner_all);
}

TEST_F(Scan, KeepsVerdictsBesideTheListInAFileThatMayBeLostOrDamaged) {
    add(L"crashesInEntryPoint");
    scan(options());
    const std::string kept = contentOf(verdictsFileOf(list()));
    EXPECT_THAT(kept, HasSubstr("\"verdict\": \"crashed\""));
    EXPECT_THAT(kept, HasSubstr("\"sentence\": \"it crashes in its entry point"));
    for (const char* damage : {"", "{", "[]", "{\"version\": \"x\"}", "{\"version\": 1}",
                               "nonsense", "{\"version\": 1, \"libraries\": [{\"verdict\": 7}]}"}) {
        std::ofstream(verdictsFileOf(list()), std::ios::binary) << damage;
        EXPECT_EQ(verdicts(scan(options())).begin()->second, Verdict::crashed) << damage;
        EXPECT_EQ(contentOf(verdictsFileOf(list())), kept) << damage;
    }
}

TEST_F(Scan, ReadsAVerdictsFileWithAnyNumberOfMembers) {
    add(L"crashesInEntryPoint");
    scan(options());
    const std::string kept = contentOf(verdictsFileOf(list()));
    std::string many = "{";
    for (int member = 0; member < 600'000; ++member)
        many += "\"" + std::to_string(member) + "\": 0, ";
    std::ofstream(verdictsFileOf(list()), std::ios::binary) << many << kept.substr(1);
    EXPECT_EQ(verdicts(scan(options())).begin()->second, Verdict::crashed);
}

TEST_F(Scan, ForgetsLibrariesThatHaveGone) {
    const auto file = add(L"goodWithKit");
    add(L"countedDescription");
    EXPECT_EQ(scan(options()).libraries.size(), 2u);
    std::filesystem::remove(file);
    EXPECT_EQ(scan(options()).libraries.size(), 1u);
}

TEST_F(Scan, WithoutAListRecordsNothing) {
    add(L"goodWithKit");
    ScanOptions wanted = options();
    wanted.list.clear();
    EXPECT_EQ(scan(wanted).libraries.size(), 1u);
    EXPECT_TRUE(std::filesystem::is_empty(lists.path()));
}

TEST_F(Scan, LeavesOutATextThatTheLocaleDoesNotCarry) {
    std::setlocale(LC_ALL, "C");
    add(L"foreignText");
    add(L"goodWithKit");
    const ScanResult result = scan(options());
    EXPECT_EQ(result.libraries.size(), 1u);
    EXPECT_EQ(verdicts(result)[add(L"foreignText").filename().string()], Verdict::textNotCarried);
}

TEST_F(Scan, LeavesOutAFileAndAFolderWhoseNameTheLocaleDoesNotCarry) {
    // Where names are bytes, some are no text; elsewhere some have no form in "C".
    const bool bytes = std::setlocale(LC_ALL, "C.UTF-8") != nullptr;
    if (!bytes)
        std::setlocale(LC_ALL, "C");
    const std::filesystem::path name =
        bytes ? std::filesystem::path(std::string("\xFF")) : std::filesystem::path(L"\u4E2D");
    add(L"goodWithKit");
    add(L"countedDescription", name);
    std::filesystem::create_directory(lists.path() / name);
    ScanOptions wanted = options();
    wanted.folders.push_back(lists.path() / name);
    const ScanResult result = scan(wanted);
    ASSERT_EQ(result.files.size(), 3u);
    EXPECT_EQ(result.files[0].verdict.verdict, Verdict::works);
    EXPECT_EQ(result.files[1].verdict.verdict, Verdict::nameNotCarried);
    EXPECT_EQ(result.files[2].verdict.verdict, Verdict::nameNotCarried);
    EXPECT_EQ(readRecordedList(list()).libraries.size(), 1u);
}

TEST_F(Scan, StopsWhenTheUserWantsAndKeepsTheRestOfTheOldList) {
    class Impatient final : public QrCastImpl<Impatient, QrProcessControl> {
      public:
        void* getContext() override { return nullptr; }
        void message(int, const wchar_t*) override {}
        bool isInterrupted() override { return true; }
        bool warning(int, const wchar_t*) override { return true; }
        bool isProgressShown() override { return true; }
        bool progress(float, const wchar_t*) override { return true; }
        bool isStatusShown() override { return false; }
        void status(const wchar_t*) override {}
        bool error(int, const wchar_t*) override { return false; }
        bool isErrorShown() override { return false; }
        void log(int, const wchar_t*) override {}
        [[noreturn]] void abort(int, const wchar_t*) override { throw 1; }
        std::wstring findFile(const wchar_t*, const wchar_t*, const wchar_t*) override {
            return {};
        }
    } impatient;
    add(L"goodWithKit");
    scan(options());
    add(L"loopsForever");
    ScanOptions wanted = options();
    wanted.controller = &impatient;
    const ScanResult result = scan(wanted);
    EXPECT_TRUE(result.interrupted);
    EXPECT_EQ(verdicts(result)[add(L"goodWithKit").filename().string()], Verdict::works);
    EXPECT_EQ(verdicts(result)[add(L"loopsForever").filename().string()], Verdict::interrupted);
    EXPECT_EQ(result.libraries.size(), 1u);
    EXPECT_EQ(readRecordedList(list()).libraries.size(), 1u);
}

TEST_F(Scan, TwoAtOnceLeaveAWholeList) {
    add(L"goodWithKit");
    add(L"countedDescription");
    std::thread other([this] { scan(options()); });
    scan(options());
    other.join();
    const ListReading reading = readRecordedList(list());
    EXPECT_EQ(reading.state, ListReading::State::good);
    EXPECT_EQ(reading.libraries.size(), 2u);
}

TEST_F(Scan, MakesSearchPathsAbsoluteAndPlain) {
    const auto here = std::filesystem::current_path();
    const auto folders = foldersOf("a/./b/../c/;;" + (here / "x").string() + ";");
    ASSERT_EQ(folders.size(), 2u);
    EXPECT_EQ(folders[0], here / "a" / "c");
    EXPECT_EQ(folders[1], here / "x");
    EXPECT_TRUE(foldersOf(";;").empty());
}

TEST_F(Scan, GoesUpFromAFolderAsTheSystemDoes) {
    std::filesystem::create_directories(folder.path() / "a" / "b");
    folder.write("a/file", "from the target");
    std::error_code failure;
    std::filesystem::create_directory_symlink(folder.path() / "a" / "b", folder.path() / "link",
                                              failure);
    const auto up = folder.path() / "link" / ".." / "file";
    const auto plain = candidateOf(up).path;
    if (failure) { // No links here, so names alone tell.
        EXPECT_EQ(plain.lexically_normal(), (folder.path() / "file").lexically_normal());
        return;
    }
    EXPECT_EQ(std::filesystem::exists(up), std::filesystem::exists(plain)) << plain;
    EXPECT_EQ(plain.lexically_normal(), plain);
}

TEST_F(Scan, NamesWhatItCannotWriteWithAllItsCharacters) {
    const std::filesystem::path list = folder.path() / u8"no \u00FC \u65E5" / "list";
    ScanOptions scanning = options();
    scanning.list = list;
    const std::wstring reason = scan(scanning).notWritten;
    EXPECT_THAT(reason, ::testing::StartsWith(displayName(list) + L": Error opening output "
                                                                  L"stream: "));
}

TEST_F(Scan, NotesANilIdentifierAndRecordsIt) {
    add(L"nilUid");
    const ScanResult result = scan(options());
    ASSERT_EQ(result.files.size(), 1u);
    EXPECT_EQ(result.files[0].verdict.verdict, Verdict::works);
    ASSERT_EQ(result.files[0].notes.size(), 1u);
    EXPECT_EQ(result.files[0].notes[0].verdict, Verdict::uidNil);
    EXPECT_EQ(result.files[0].notes[0].words, L"nameless");
    EXPECT_EQ(result.libraries.at(0).builders.size(), 1u);
    ExplainOptions loading;
    loading.load = true;
    loading.probe = patient();
    const Explanation explanation = explainFile(result.files[0].path, loading);
    ASSERT_EQ(explanation.notes.size(), 1u);
    EXPECT_EQ(explanation.notes[0].verdict, Verdict::uidNil);
}

} // namespace
