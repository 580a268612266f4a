// SPDX-License-Identifier: BSL-1.0
/// Tests guarded imports that end well, and those that are refused: what comes back, and what the
/// caller's controller receives.
#include "tests/guarding/guardingFixture.h"

#include "components/componentManager/utf8.h"

#include <algorithm>
#include <clocale>

using namespace Mz;
using namespace Mz::Test;
using Kit::GuardedImport;
using Kit::ImportVerdict;
using ::testing::ElementsAre;
using ::testing::EndsWith;
using ::testing::HasSubstr;

namespace {

TEST(GuardingWithoutManager, IsRefused) {
    if (QrGetComponentManager()->getBuilder(parcelUid))
        GTEST_SKIP() << "an earlier test in this process has initialised the component manager";
    EXPECT_EQ(Kit::importGuarded("file").verdict, ImportVerdict::noManager);
}

TEST_F(Guarding, BringsBackWhatIsSharedAndCircles) {
    const GuardedImport import = this->import("importing graph");
    ASSERT_EQ(import.verdict, ImportVerdict::imported) << import.detail.c_str();
    EXPECT_EQ(import.detail, L"Hostile");
    const QrPtr<Parcel> root = parcelOf(import);
    ASSERT_TRUE(root && root->first && root->second);
    EXPECT_EQ(root->text, L"root");
    EXPECT_EQ(root->first->text, L"shared");
    EXPECT_EQ(root->second->text, L"other \x20AC");
    EXPECT_EQ(root->second->first.get(), root->first.get());
    EXPECT_EQ(root->second->second.get(), root.get());
    root->second->second.reset();
}

TEST_F(Guarding, RelaysTheCallsOfTheImporter) {
    const GuardedImport import = this->import("importing talk");
    ASSERT_EQ(import.verdict, ImportVerdict::imported);
    EXPECT_EQ(parcelOf(import)->text, L"101010101 found name");
    EXPECT_THAT(controller.notes,
                ElementsAre(L"message 1 a message", L"warning 2 a warning", L"error 3 an error",
                            L"progress 25 a quarter", L"progress 100 all", L"status 0 a status",
                            L"log 4 an entry", L"findFile 0 here;there"));
}

TEST_F(Guarding, RelaysProgressAHundredTimesASecond) {
    const GuardedImport import = this->import("importing hurry");
    ASSERT_EQ(import.verdict, ImportVerdict::imported);
    const auto milliseconds = std::stoul(parcelOf(import)->text);
    for (const wchar_t* report : {L"progress", L"status"}) {
        const auto count = static_cast<unsigned long>(
            std::count_if(controller.notes.begin(), controller.notes.end(),
                          [&](const std::wstring& note) { return note.starts_with(report); }));
        EXPECT_GE(count, 2u) << toUtf8(report);
        EXPECT_LE(count, milliseconds / 10 + 2) << toUtf8(report);
    }
}

TEST_F(Guarding, NeedsNoController) {
    QrSetSystemProcessController(nullptr);
    EXPECT_EQ(import("importing null").verdict, ImportVerdict::gaveNothing);
    limits.time = std::chrono::milliseconds(300);
    EXPECT_EQ(import("importing hang").verdict, ImportVerdict::timedOut);
    EXPECT_TRUE(controller.notes.empty());
}

TEST_F(Guarding, PassesTheAbortOfTheImporterToTheCaller) {
    EXPECT_THROW(import("importing abortController"), Assertions::ExProgramAborted);
    EXPECT_THAT(controller.notes, ElementsAre(L"abort 9 the importer gives up"));
}

TEST_F(Guarding, StopsWhenTheUserInterrupts) {
    controller.interrupted = true;
    EXPECT_EQ(import("importing hang").verdict, ImportVerdict::interrupted);
}

TEST_F(Guarding, CountsTheTimeInTenthsOfASecond) {
    limits.time = std::chrono::milliseconds(345);
    const GuardedImport import = this->import("importing hang");
    EXPECT_EQ(import.verdict, ImportVerdict::timedOut);
    EXPECT_EQ(import.detail, L"0.3");
}

TEST_F(Guarding, SearchesTheFoldersOfTheCaller) {
    const TemporaryDirectory empty;
    limits.searchPath = searchPathOf(empty.path());
    EXPECT_EQ(import("importing null").verdict, ImportVerdict::notTaken);
    limits.searchPath =
        searchPathOf(std::filesystem::path(MZ_BUILD_PATH) / "components" / "hostile");
    EXPECT_EQ(import("importing null").verdict, ImportVerdict::gaveNothing);
}

TEST_F(Guarding, HasTheLocaleOfTheHost) {
    ASSERT_TRUE(std::setlocale(LC_ALL, "C"));
    EXPECT_EQ(parcelOf(import("importing locale"))->text, L"C");
}

TEST_F(Guarding, NamesTheClassThatCannotComeBack) {
    for (const char* act : {"importing fleeting", "importing innerFleeting"}) {
        const GuardedImport import = this->import(act);
        EXPECT_EQ(import.verdict, ImportVerdict::notPersistent);
        EXPECT_EQ(import.detail, L"Mz::Test::Fleeting");
        EXPECT_FALSE(import.object);
        EXPECT_THAT(import.sentence(), HasSubstr(L"Mz::Test::Fleeting"));
    }
    const GuardedImport stranger = import("importing stranger");
    EXPECT_EQ(stranger.verdict, ImportVerdict::unknownClass);
    EXPECT_THAT(stranger.detail, HasSubstr(L"StoredParcel"));
    EXPECT_THAT(stranger.detail, HasSubstr(L"00040003"));
}

TEST_F(Guarding, RefusesClassesThatTheCallerDidNotAllow) {
    limits.classes = {parcelUid};
    const GuardedImport allowed = import("importing graph");
    ASSERT_EQ(allowed.verdict, ImportVerdict::imported) << allowed.sentence().c_str();
    parcelOf(allowed)->second->second.reset();
    limits.classes = {fussyUid};
    const GuardedImport other = import("importing graph");
    EXPECT_EQ(other.verdict, ImportVerdict::answerRejected);
    EXPECT_THAT(other.detail, HasSubstr(L"is not allowed"));
    // Nothing runs if no allowed class exists.
    limits.classes = {strangerUid};
    limits.program = folder.path() / "missing";
    const GuardedImport none = import("importing graph");
    EXPECT_EQ(none.verdict, ImportVerdict::noClass);
    EXPECT_THAT(none.detail, HasSubstr(L"00040003"));
}

TEST_F(Guarding, SaysWhyNothingWasImported) {
    EXPECT_EQ(import("refused").verdict, ImportVerdict::notTaken);
    EXPECT_EQ(import("importing null").verdict, ImportVerdict::gaveNothing);
    EXPECT_EQ(import("importing deep").verdict, ImportVerdict::notStored);
    EXPECT_EQ(Kit::importGuarded(folder.path() / "missing", limits).verdict,
              ImportVerdict::fileMissing);
    EXPECT_EQ(Kit::importGuarded(folder.path(), limits).verdict, ImportVerdict::fileMissing);
    const GuardedImport fussy = import("importing fussy");
    EXPECT_EQ(fussy.verdict, ImportVerdict::answerRejected);
    EXPECT_THAT(fussy.detail, HasSubstr(L"a fussy parcel"));
    limits.builderName = L"another";
    EXPECT_EQ(import("importing graph").verdict, ImportVerdict::notTaken);
    limits.program = folder.path() / "missing";
    EXPECT_EQ(import("importing graph").verdict, ImportVerdict::guardFailed);
}

#if MZ_HAS_COMMAND
TEST_F(Guarding, NamesTheStatusOfAProgramThatEndsAtOnce) {
    limits.program = std::filesystem::path(MZ_BUILD_PATH) / "bin" /
                     (std::wstring(L"mzcomponents") + MZ_PROGRAM_EXTENSION);
    const GuardedImport import = this->import("importing graph");
    EXPECT_EQ(import.verdict, ImportVerdict::guardFailed);
    EXPECT_EQ(import.detail, L"the process ended at once, with status 2");
}
#endif

TEST_F(Guarding, LimitsTheStoredObject) {
    limits.answer = std::uint64_t{1} << 20;
    EXPECT_EQ(import("importing large").verdict, ImportVerdict::answerTooLong);
    limits = {};
    EXPECT_EQ(import("importing large").verdict, ImportVerdict::imported);
    limits.objects = 6;
    EXPECT_EQ(import("importing graph").verdict, ImportVerdict::answerRejected);
    limits.objects = 7; // three objects, two references, two nulls
    const GuardedImport import = this->import("importing graph");
    ASSERT_EQ(import.verdict, ImportVerdict::imported);
    parcelOf(import)->second->second.reset();
}

TEST_F(Guarding, SaysWhichRightsTheProcessHad) {
    const GuardedImport import = this->import("importing rights");
    ASSERT_EQ(import.verdict, ImportVerdict::imported);
    const std::wstring rights = parcelOf(import)->text;
    if (import.withoutFiles) {
        EXPECT_EQ(rights.find(L"files"), std::wstring::npos);
        EXPECT_FALSE(std::filesystem::exists("written by an importer"));
    }
    if (import.withoutNetwork) {
        EXPECT_EQ(rights.find(L"network"), std::wstring::npos);
    }
    if (import.withoutProcesses) {
        EXPECT_EQ(rights, L"");
    }
    std::filesystem::remove("written by an importer");
    if (MZ_CONFINED) {
        EXPECT_TRUE(import.withoutFiles && import.withoutNetwork && import.withoutProcesses);
    }
}

TEST_F(Guarding, DescribesEachVerdict) {
    for (int number = 0; number <= static_cast<int>(ImportVerdict::guardFailed); ++number) {
        GuardedImport import;
        import.verdict = static_cast<ImportVerdict>(number);
        import.file = "file.act";
        import.activity = L"ACTIVITY";
        import.detail = L"DETAIL";
        const std::wstring sentence = import.sentence();
        EXPECT_THAT(sentence, ::testing::StartsWith(L"file.act: "));
        EXPECT_EQ(sentence.find(L'%'), std::wstring::npos);
        EXPECT_STRNE(nameOf(import.verdict), "");
        EXPECT_TRUE(number == static_cast<int>(ImportVerdict::guardFailed) ||
                    nameOf(import.verdict) != std::string("guardFailed"));
    }
    EXPECT_STREQ(nameOf(static_cast<ImportVerdict>(1000)), "guardFailed")
        << "a verdict of a later version";
    GuardedImport import;
    import.verdict = ImportVerdict::crashed;
    import.file = "a.obj";
    import.activity = L"the import by \"OBJ\"";
    import.detail = L"a breakpoint";
    EXPECT_EQ(import.sentence(), L"a.obj: the import by \"OBJ\" crashed: a breakpoint. The host is "
                                 L"not affected. Report it to the author of the importer.");
    import.activity.clear();
    EXPECT_THAT(import.reason(), ::testing::StartsWith(L"the start of the process crashed: "));
}

} // namespace
