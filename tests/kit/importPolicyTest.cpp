// SPDX-License-Identifier: BSL-1.0
// Imports under a policy: which builders are asked, what limits an import, and what its result
// says. A manager is initialised once, so each of these tests needs a separate process, as ctest
// gives it one.
#include "components/componentKit/hostKit.h"
#include "tests/kit/importers.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <map>
#include <string>
#include <vector>

using namespace Mz;
using namespace Mz::Test;
using testing::ElementsAre;
using testing::HasSubstr;
using Answer = Kit::BuilderAnswer;
using std::chrono::milliseconds;

namespace {

const std::filesystem::path components =
    std::filesystem::path(MZ_BUILD_PATH) / "components" / "kitImporters";

/// Keeps what it is told, and finds files as the controller before it.
class Log : public Kit::Controller {
  public:
    void show(Kind, const wchar_t* text) override { shown.emplace_back(text); }
    bool isInterrupted() override { return interrupted; }
    void* getContext() override { return this; }
    std::vector<std::wstring> shown;
    bool interrupted = false;
};

class KitImportPolicy : public testing::Test {
  protected:
    KitImportPolicy() {
        EXPECT_TRUE(Kit::builders().empty()) << "Run each test in a process of its own.";
    }

    /// Starts with all components. Not in the constructor, for tests that read a list before.
    static void initialize() { Kit::initialize(components); }

    /// Imports a script under the name "input.a", which the builder A lists.
    Kit::ImportResult import(const char* script, const wchar_t* name = L"input.a") const {
        return Kit::importFrom(L"script", script, name, policy);
    }

    static std::vector<Answer> answers(const Kit::ImportResult& result) {
        std::vector<Answer> all;
        for (const Kit::BuilderReport& builder : result.builders)
            all.push_back(builder.answer);
        return all;
    }

    static std::wstring words(const Kit::ImportResult& result) {
        const QrPtr<Words> object = queryCast<Words>(result.object.get());
        return object ? object->words() : L"(none)";
    }

    Log log;
    const Kit::ControllerScope installed{log};
    Kit::ImportPolicy policy;
    TemporaryDirectory folder;
};

// ---- Who is asked -------------------------------------------------------------------------------

TEST_F(KitImportPolicy, SaysWhoTookTheInput) {
    initialize();
    const Kit::ImportResult result = import("A=take;B=take;C=take");
    EXPECT_TRUE(result);
    EXPECT_EQ(result.end, Kit::ImportEnd::imported);
    EXPECT_EQ(words(result), L"A");
    EXPECT_EQ(result.name, L"input.a");
    EXPECT_EQ(result.file, L"");
    EXPECT_THAT(answers(result), ElementsAre(Answer::took, Answer::notAsked, Answer::notAsked));
    EXPECT_TRUE(result.builders[0].uid == alphaUid);
    EXPECT_EQ(result.builders[0].label, L"Alpha");
    EXPECT_EQ(result.decider(), &result.builders[0]);
}

TEST_F(KitImportPolicy, AsksByNameFirst) {
    initialize();
    const Kit::ImportResult result = import("A=take;B=take;C=take", L"input.c");
    EXPECT_EQ(words(result), L"C");
    EXPECT_THAT(answers(result),
                ElementsAre(Answer::declinedByName, Answer::declinedByName, Answer::took));
}

TEST_F(KitImportPolicy, AsksByContentThen) {
    initialize();
    const Kit::ImportResult result = import("B=take;C=take");
    EXPECT_EQ(words(result), L"B");
    EXPECT_THAT(answers(result),
                ElementsAre(Answer::declinedByContent, Answer::took, Answer::declinedByName));
}

TEST_F(KitImportPolicy, AsksByNameOnlyIfThePolicySaysSo) {
    initialize();
    policy.byContent = false;
    const Kit::ImportResult result = import("B=take");
    EXPECT_EQ(result.end, Kit::ImportEnd::declined);
    EXPECT_FALSE(result.object);
    EXPECT_EQ(result.decider(), nullptr);
    EXPECT_THAT(answers(result), ElementsAre(Answer::declinedByContent, Answer::declinedByName,
                                             Answer::declinedByName));
}

TEST_F(KitImportPolicy, AsksAllBuildersAboutAnInputWithoutAName) {
    initialize();
    policy.byContent = false;
    EXPECT_EQ(words(import("C=take", L"")), L"C");
    EXPECT_EQ(words(import("C=texts", L"")), L"|");
}

TEST_F(KitImportPolicy, ComparesExtensionsExactly) {
    initialize();
    policy.byContent = false;
    EXPECT_TRUE(import("A=take", L"x.b.a"));
    EXPECT_FALSE(import("A=take", L"x.A"));
    EXPECT_FALSE(import("A=take", L"a"));
    EXPECT_FALSE(import("A=take", L"x.aa"));
}

TEST_F(KitImportPolicy, AsksNoBuilderThatIsDenied) {
    initialize();
    policy.deny = {alphaUid};
    const Kit::ImportResult result = import("A=take;B=take");
    EXPECT_EQ(words(result), L"B");
    EXPECT_THAT(answers(result), ElementsAre(Answer::denied, Answer::took, Answer::declinedByName));
}

TEST_F(KitImportPolicy, AsksOnlyBuildersThatAreAllowed) {
    initialize();
    policy.allow = {gammaUid, betaUid};
    EXPECT_THAT(answers(import("A=take")),
                ElementsAre(Answer::denied, Answer::declinedByContent, Answer::declinedByContent));
    policy.deny = {betaUid};
    EXPECT_THAT(answers(import("A=take;B=take;C=take")),
                ElementsAre(Answer::denied, Answer::denied, Answer::took));
}

/// Not a test, but another process, which records the components for the next test.
TEST(KitImportPolicyList, DISABLED_Writes) {
    Kit::initialize(components);
    Kit::writeList(std::getenv("MZ_KIT_LIST"));
}

TEST_F(KitImportPolicy, LoadsNoBuilderThatIsDenied) {
    const std::filesystem::path list = folder.path() / "list";
    setEnvironment("MZ_KIT_LIST", list.string());
    const std::filesystem::path self =
        std::filesystem::path(MZ_BUILD_PATH) / "bin" / (L"kitTests" MZ_PROGRAM_EXTENSION);
    const ProgramResult written = runProgram(
        self, "kitTests",
        {"--gtest_filter=KitImportPolicyList.*", "--gtest_also_run_disabled_tests"}, folder.path());
    ASSERT_EQ(written.exitCode, 0) << written.output;
    ASSERT_TRUE(Kit::readList(list));
    initialize();

    const std::filesystem::path more = components / (L"kitMoreImporters" MZ_LIBRARY_EXTENSION);
    policy.deny = {gammaUid};
    EXPECT_EQ(import("C=take").end, Kit::ImportEnd::declined);
    EXPECT_FALSE(isMapped(more));
    EXPECT_TRUE(isMapped(components / (L"kitImporters" MZ_LIBRARY_EXTENSION)));
    policy.deny.clear();
    EXPECT_TRUE(import("C=take"));
    EXPECT_TRUE(isMapped(more));
}

TEST_F(KitImportPolicy, TakesTheBuildersOfAnImporter) {
    initialize();
    EXPECT_TRUE(Kit::importFrom(*Kit::newImporter<L"script">(), "A=take", L"x", policy));
    const QrPtr<QrImporter> importer = Kit::newImporter<L"script">();
    EXPECT_TRUE(Kit::importFrom(*importer, "A=take", L"x", policy));
    EXPECT_TRUE(Kit::importFrom(L"no family", "A=take", L"x", policy).builders.empty());
}

TEST_F(KitImportPolicy, TakesBytesOfAnyValue) {
    initialize();
    const std::string script("A=take;\0\xFF", 9);
    EXPECT_TRUE(Kit::importFrom(L"script", std::as_bytes(std::span(script)), L"x.a"));
}

// ---- Builders that fail -------------------------------------------------------------------------

TEST_F(KitImportPolicy, GoesOnAfterABuilderThatThrowsWhenAsked) {
    initialize();
    const Kit::ImportResult result = import("A=canThrow;B=canThrowNumber;C=take");
    EXPECT_EQ(words(result), L"C");
    EXPECT_THAT(answers(result),
                ElementsAre(Answer::failedToAnswer, Answer::failedToAnswer, Answer::took));
    EXPECT_EQ(result.builders[0].reason, L"broken question");
    EXPECT_EQ(result.builders[1].reason, L"an exception of an unknown type");
}

TEST_F(KitImportPolicy, BeginsAgainForEachBuilder) {
    initialize();
    EXPECT_EQ(words(import("A=canBlock;B=take")), L"B");
    EXPECT_EQ(words(import("A=canThrow;B=canBlock;C=take")), L"C");
}

TEST_F(KitImportPolicy, EndsWithTheBuilderThatAccepts) {
    initialize();
    for (const char* script : {"A=null;B=take", "A=error;B=take", "A=throw;B=take"}) {
        const Kit::ImportResult result = import(script);
        EXPECT_EQ(result.end, Kit::ImportEnd::failed) << script;
        EXPECT_FALSE(result.object);
        EXPECT_THAT(answers(result),
                    ElementsAre(Answer::failed, Answer::notAsked, Answer::notAsked));
        EXPECT_EQ(result.decider(), &result.builders[0]);
    }
}

TEST_F(KitImportPolicy, KeepsTheReasonsOfABuilder) {
    initialize();
    EXPECT_EQ(import("A=null").builders[0].reason, L"");
    EXPECT_EQ(import("A=error").builders[0].reason, L"line 1: bad; line 2: worse");
    EXPECT_EQ(import("A=throw").builders[0].reason, L"broken import");
    EXPECT_THAT(log.shown, ElementsAre(L"line 1: bad", L"line 2: worse"));
}

TEST_F(KitImportPolicy, LetsAnAbortPass) {
    initialize();
    EXPECT_THROW(import("A=abort"), Assertions::ExProgramAborted);
    EXPECT_THAT(log.shown, ElementsAre(L"stop all"));
    EXPECT_EQ(QrGetThreadProcessController(), nullptr);
    EXPECT_TRUE(import("A=take"));
}

TEST_F(KitImportPolicy, ReportsOddBuilders) {
    initialize();
    const Kit::ImportResult result = Kit::importFrom(L"odd", "D=take", L"x.other");
    EXPECT_EQ(words(result), L"D");
    EXPECT_THAT(answers(result),
                ElementsAre(Answer::notLoaded, Answer::failedToAnswer, Answer::took));
    EXPECT_EQ(result.builders[1].reason, L"its extensions cannot be listed");
    EXPECT_EQ(result.builders[1].label, L"(no label)");
}

// ---- Limits -------------------------------------------------------------------------------------

TEST_F(KitImportPolicy, AsksNoBuilderAboutAnInputThatIsTooLarge) {
    initialize();
    policy.byteLimit = 5;
    const Kit::ImportResult result = import("A=take");
    EXPECT_EQ(result.end, Kit::ImportEnd::tooLarge);
    EXPECT_THAT(answers(result), ElementsAre(Answer::notAsked, Answer::notAsked, Answer::notAsked));
    const std::filesystem::path file = folder.write("x.a", "A=take");
    EXPECT_EQ(Kit::importFile(L"script", file, policy).end, Kit::ImportEnd::tooLarge);
    policy.byteLimit = 6;
    EXPECT_TRUE(import("A=take"));
    EXPECT_TRUE(Kit::importFile(L"script", file, policy));
}

TEST_F(KitImportPolicy, InterruptsABuilderWhenTheTimeIsOver) {
    initialize();
    policy.timeLimit = milliseconds(50);
    for (const char* script : {"A=wait", "A=warn", "A=progress", "A=reread", "A=canReread"}) {
        const Kit::ImportResult result = import(script);
        EXPECT_EQ(result.end, Kit::ImportEnd::timeOver) << script;
        EXPECT_FALSE(result.object) << "An object that is half read is none.";
        EXPECT_THAT(result.builders[0].answer,
                    testing::AnyOf(Answer::failed, Answer::failedToAnswer));
    }
}

TEST_F(KitImportPolicy, AsksNoOtherBuilderWhenTheTimeIsOver) {
    initialize();
    policy.timeLimit = milliseconds(0);
    EXPECT_THAT(answers(import("A=take")),
                ElementsAre(Answer::failedToAnswer, Answer::notAsked, Answer::notAsked));
}

TEST_F(KitImportPolicy, LeavesTheUsersInterruptionToTheBuilder) {
    initialize();
    log.interrupted = true;
    EXPECT_EQ(import("A=wait").end, Kit::ImportEnd::failed);
}

// ---- Files --------------------------------------------------------------------------------------

TEST_F(KitImportPolicy, ImportsFiles) {
    initialize();
    const std::filesystem::path file = folder.write("input.a", "A=texts");
    const std::wstring name = Kit::wideName(file);
    Kit::ImportResult result = Kit::importFile(L"script", file);
    EXPECT_EQ(words(result), name + L"|");
    EXPECT_EQ(result.file, name);
    result = Kit::importFile(L"script", "input.a", policy, folder.text().c_str());
    EXPECT_EQ(words(result), L"input.a|input.a") << "as QrBaseImporter::import";
    EXPECT_EQ(result.name, L"input.a");
    EXPECT_EQ(result.file, folder.text() + L"/input.a");
}

TEST_F(KitImportPolicy, UsesTheDefaultSearchPathOfAnImporter) {
    initialize();
    class Searching final : public QrCastImpl<Searching, QrBaseImporter> {
      public:
        const wchar_t* getBuilderName() const override { return L"script"; }
        const wchar_t* getDefaultSearch() const override { return path.c_str(); }
        std::wstring path;
    };
    Searching importer;
    importer.path = folder.text();
    folder.write("input.a", "A=take");
    EXPECT_TRUE(Kit::importFile(importer, "input.a"));
    const QrImporter& base = importer;
    EXPECT_EQ(Kit::importFile(base, "input.a").end, Kit::ImportEnd::notFound);
}

TEST_F(KitImportPolicy, SaysWhyAFileIsNotRead) {
    initialize();
    Kit::ImportResult result = Kit::importFile(L"script", folder.path() / "missing.a");
    EXPECT_EQ(result.end, Kit::ImportEnd::notFound);
    EXPECT_TRUE(result.builders.empty());
    EXPECT_EQ(Kit::importFile(L"script", folder.path()).end, Kit::ImportEnd::notFound);

    class Liar final : public Kit::Controller {
      public:
        std::wstring findFile(const wchar_t*, const wchar_t*, const wchar_t*) override {
            return answer;
        }
        std::wstring answer;
    };
    Liar liar;
    const Kit::ControllerScope scope(liar);
    for (const std::wstring& name : {folder.text(), folder.text() + L"/missing"}) {
        liar.answer = name;
        result = Kit::importFile(L"script", "x.a");
        EXPECT_EQ(result.end, Kit::ImportEnd::notOpened);
        EXPECT_EQ(result.file, name);
    }
}

TEST_F(KitImportPolicy, NeedsAControllerForFilesOnly) {
    initialize();
    QrSetSystemProcessController(nullptr);
    EXPECT_THROW(Kit::importFile(L"script", "x"), QrComponentManagerEx::ExBadCast);
    EXPECT_TRUE(import("A=take"));
    EXPECT_EQ(import("A=error").builders[0].reason, L"line 1: bad; line 2: worse");
    EXPECT_THROW(import("A=abort"), Assertions::ExProgramAborted);
    EXPECT_EQ(words(import("A=find x")), L"");
    QrSetSystemProcessController(&log);
}

// ---- Companion files ----------------------------------------------------------------------------

class KitCompanions : public KitImportPolicy {
  protected:
    KitCompanions() {
        initialize();
        std::filesystem::create_directories(folder.path() / "models" / "colours");
        folder.write("models/beside.m", "x");
        folder.write("models/colours/below.m", "long text");
        folder.write("outside.m", "x");
    }

    /// Returns the file that a builder is given for `name`, relative to the test's folder.
    std::wstring find(const std::string& name) {
        const std::filesystem::path file = folder.write("models/input.a", "A=find " + name);
        result = Kit::importFile(L"script", file, policy);
        EXPECT_EQ(result.companions.size(), 1U);
        EXPECT_EQ(result.companions[0].name, Kit::wideText(std::string_view(name)));
        EXPECT_EQ(words(result), result.companions[0].found);
        const std::wstring found = words(result), start = folder.text();
        return found.rfind(start, 0) == 0 ? found.substr(start.size()) : found;
    }

    Kit::ImportResult result;
};

TEST_F(KitCompanions, AreFoundBesideTheInput) {
    for (const Kit::Companions where : {Kit::Companions::anywhere, Kit::Companions::beside}) {
        policy.companions = where;
        EXPECT_THAT(find("beside.m"), testing::AnyOf(L"/models/beside.m", L"\\models/beside.m"));
        EXPECT_THAT(find("colours/below.m"),
                    testing::AnyOf(L"/models/colours/below.m", L"\\models/colours/below.m"));
        EXPECT_EQ(find("missing.m"), L"");
        EXPECT_EQ(result.companions[0].reason, L"");
    }
}

TEST_F(KitCompanions, AreFoundElsewhereIfThePolicySaysSo) {
    const std::string outside = (folder.path() / "outside.m").string();
    const std::string up = (folder.path() / "models" / ".." / "outside.m").string();
    EXPECT_NE(find(outside), L"");
    EXPECT_NE(find(up), L"");
    policy.companions = Kit::Companions::beside;
    for (const std::string& name : {outside, up, std::string("../outside.m"), std::string("/x")}) {
        EXPECT_EQ(find(name), L"") << name;
        EXPECT_EQ(result.companions[0].reason, L"the policy permits only files beside the input");
    }
    policy.companions = Kit::Companions::none;
    EXPECT_EQ(find("beside.m"), L"");
    EXPECT_EQ(result.companions[0].reason, L"the policy permits no companion files");
}

TEST_F(KitCompanions, AreWithinTheByteLimit) {
    policy.byteLimit = 100;
    EXPECT_NE(find("beside.m"), L"");
    folder.write("models/colours/below.m", std::string(101, 'x'));
    EXPECT_EQ(find("colours/below.m"), L"");
    EXPECT_EQ(result.companions[0].reason, L"larger than the policy permits");
    EXPECT_TRUE(result) << "The input itself is not too large.";
}

TEST_F(KitCompanions, OfBytesComeFromTheHost) {
    class Extracting final : public Kit::Controller {
        std::wstring findFile(const wchar_t* name, const wchar_t*, const wchar_t*) override {
            return std::wstring(L"copy of ") + name;
        }
    };
    Extracting host;
    const Kit::ControllerScope scope(host);
    EXPECT_EQ(words(import("A=find colours.m")), L"copy of colours.m");
    policy.companions = Kit::Companions::beside;
    EXPECT_EQ(words(import("A=find colours.m")), L"");
}

TEST_F(KitCompanions, OfAFileInTheCurrentFolderAreThere) {
    folder.write("input.a", "A=find outside.m");
    std::filesystem::current_path(folder.path());
    policy.companions = Kit::Companions::beside;
    EXPECT_EQ(words(Kit::importFile(L"script", "input.a", policy)), L"./outside.m");
    std::filesystem::current_path(folder.path().parent_path());
}

TEST(KitCompanionNames, AreBesideTheInput) {
    using Kit::detail::besideName;
    EXPECT_EQ(besideName(L"a/b.x", L"c"), L"a/c");
    EXPECT_EQ(besideName(L"b.x", L"c"), L"./c");
    EXPECT_EQ(besideName(L"/b.x", L"c"), L"/c");
    // A character that the locale lacks, where file names are in the locale's bytes.
    const std::wstring lacking = L"\u65E5/b.x";
    EXPECT_EQ(besideName(lacking, L"c"), toNativePath(lacking) ? L"\u65E5/c" : L"");
}

TEST(KitCompanionNames, StayBelowAFolder) {
    for (const wchar_t* name : {L"a", L"a/b", L"a\\b", L".", L"./a", L"a/", L".a", L"..a", L"a.."})
        EXPECT_TRUE(Kit::detail::staysBelow(name)) << toNarrow(name, '?');
    for (const wchar_t* name : {L"", L"/a", L"\\a", L"..", L"../a", L"a/..", L"a\\..\\b", L"a/.. ",
                                L"...", L"c:a", L"c:\\a", L"a:stream", L"//server/a"})
        EXPECT_FALSE(Kit::detail::staysBelow(name)) << toNarrow(name, '?');
}

TEST_F(KitImportPolicy, ReportsToTheControllerOfTheThread) {
    initialize();
    Log own;
    const Kit::ControllerScope scope(own, Kit::ControllerScope::thread);
    EXPECT_EQ(import("A=error").builders[0].reason, L"line 1: bad; line 2: worse");
    EXPECT_EQ(own.shown.size(), 2U);
    EXPECT_TRUE(log.shown.empty());
    EXPECT_EQ(QrGetThreadProcessController(), &own);
}

// ---- The controller of the host -----------------------------------------------------------------

TEST(KitImportController, PassesEverythingOn) {
    class FullLog final : public Log {
        void status(const wchar_t* text) override { shown.emplace_back(text); }
        void log(int, const wchar_t* text) override { shown.emplace_back(text); }
    };
    FullLog host;
    const Kit::ImportPolicy policy;
    Kit::detail::ImportLimits limits({}, {});
    std::vector<Kit::CompanionReport> companions;
    const std::wstring file;
    Kit::detail::ImportController controller(&host, policy, limits, file, companions);
    EXPECT_EQ(controller.getContext(), &host);
    controller.message(0, L"m");
    EXPECT_TRUE(controller.warning(0, L"w"));
    EXPECT_FALSE(controller.error(0, L"e"));
    EXPECT_EQ(controller.isErrorShown(), host.isErrorShown());
    EXPECT_EQ(controller.isProgressShown(), host.isProgressShown());
    EXPECT_EQ(controller.isStatusShown(), host.isStatusShown());
    EXPECT_TRUE(controller.progress(0.5F, L""));
    EXPECT_FALSE(controller.isInterrupted());
    host.interrupted = true;
    EXPECT_TRUE(controller.isInterrupted());
    EXPECT_FALSE(controller.progress(0.5F, L""));
    controller.status(L"s");
    controller.log(0, L"l");
    EXPECT_FALSE(controller.wasAborted());
    EXPECT_THROW(controller.abort(0, L"a"), Assertions::ExProgramAborted);
    EXPECT_TRUE(controller.wasAborted());
    EXPECT_THAT(host.shown, ElementsAre(L"m", L"w", L"e", L"s", L"l", L"a"));
    EXPECT_EQ(controller.takeErrors(), L"e");
    EXPECT_EQ(controller.takeErrors(), L"");
}

TEST(KitImportController, PassesOnWhatTheHostAnswers) {
    class Host final : public Log {
      public:
        bool warning(int, const wchar_t*) override { return answer; }
        bool isProgressShown() override { return answer; }
        bool isStatusShown() override { return answer; }
        bool error(int, const wchar_t*) override { return answer; }
        bool isErrorShown() override { return answer; }
        std::wstring findFile(const wchar_t*, const wchar_t*, const wchar_t*) override {
            return noName;
        }
        bool answer = false;
        std::wstring noName = L"a name that no file has: \xD800";
    } host;
    Kit::ImportPolicy policy;
    policy.companions = Kit::Companions::anywhere;
    Kit::detail::ImportLimits limits(0, {});
    std::vector<Kit::CompanionReport> companions;
    const std::wstring file;
    Kit::detail::ImportController controller(&host, policy, limits, file, companions);
    for (const bool answer : {false, true}) {
        host.answer = answer;
        EXPECT_EQ(controller.warning(0, L"w"), answer);
        EXPECT_EQ(controller.isProgressShown(), answer);
        EXPECT_EQ(controller.isStatusShown(), answer);
        EXPECT_EQ(controller.error(0, L"e"), answer);
        EXPECT_EQ(controller.isErrorShown(), answer);
    }
    EXPECT_EQ(controller.findFile(L"x.m", nullptr, nullptr), host.noName);
    const Kit::ControllerScope scope(host, Kit::ControllerScope::thread);
    const Kit::ImportResult result = Kit::importFile(L"script", "x.a");
    EXPECT_EQ(result.end, Kit::ImportEnd::notOpened);
    EXPECT_EQ(result.file, host.noName);
}

TEST(KitImportController, AnswersByItselfIfTheHostHasNone) {
    Kit::ImportPolicy policy;
    Kit::detail::ImportLimits limits({}, {});
    std::vector<Kit::CompanionReport> companions;
    const std::wstring file = L"folder/input.a";
    Kit::detail::ImportController controller(nullptr, policy, limits, file, companions);
    EXPECT_EQ(controller.getContext(), nullptr);
    controller.message(0, L"m");
    controller.status(L"s");
    controller.log(0, L"l");
    EXPECT_TRUE(controller.warning(0, L"w"));
    EXPECT_TRUE(controller.progress(0.5F, L""));
    EXPECT_FALSE(controller.isInterrupted());
    EXPECT_FALSE(controller.isProgressShown());
    EXPECT_FALSE(controller.isStatusShown());
    EXPECT_TRUE(controller.isErrorShown());
    EXPECT_FALSE(controller.error(0, L"e"));
    EXPECT_EQ(controller.takeErrors(), L"e");
    for (const auto companion : {Kit::Companions::beside, Kit::Companions::anywhere}) {
        policy.companions = companion;
        EXPECT_EQ(controller.findFile(L"x.m", nullptr, nullptr), L"");
        EXPECT_EQ(companions.back().reason, L"");
    }
    EXPECT_TRUE(controller.hasInterface(QrProcessControl::uid));
    EXPECT_FALSE(controller.hasInterface(Words::uid));
    EXPECT_EQ(queryCast<QrProcessControl>(&controller).get(), &controller);
    EXPECT_EQ(queryCast<Words>(&controller).get(), nullptr);
    EXPECT_THROW(controller.abort(0, L"a"), Assertions::ExProgramAborted);
    EXPECT_TRUE(controller.wasAborted());
}

TEST(KitImportController, StopsTheImporterWhenTheTimeIsOver) {
    const Kit::ImportPolicy policy;
    Kit::detail::ImportLimits limits({}, milliseconds(0));
    std::vector<Kit::CompanionReport> companions;
    const std::wstring file;
    Kit::detail::ImportController controller(nullptr, policy, limits, file, companions);
    EXPECT_TRUE(controller.isInterrupted());
    EXPECT_FALSE(controller.warning(0, L"w"));
    EXPECT_FALSE(controller.progress(0.5F, L""));
}

TEST(KitImportController, GivesACompanionThatItCannotMeasureAsItIs) {
    class Host final : public Log {
        std::wstring findFile(const wchar_t*, const wchar_t*, const wchar_t*) override {
            return L"does not exist";
        }
    };
    Host host;
    Kit::ImportPolicy policy;
    policy.companions = Kit::Companions::anywhere;
    Kit::detail::ImportLimits limits(0, {}); // Any size is too large.
    std::vector<Kit::CompanionReport> companions;
    const std::wstring file;
    Kit::detail::ImportController controller(&host, policy, limits, file, companions);
    EXPECT_EQ(controller.findFile(L"x.m", nullptr, nullptr), L"does not exist");
}

TEST(KitImportController, HasTheInterfacesOfTheHostsController) {
    class Host final : public QrCastImpl<Host, Words> {
      public:
        const std::wstring& words() const override { return text; }
        std::wstring text;
    };
    class Both final : public Kit::Controller {
      public:
        QrCastable* getInterface(const QrUid& wanted) override {
            return wanted == Words::uid ? extra.getInterface(wanted)
                                        : Kit::Controller::getInterface(wanted);
        }
        bool hasInterface(const QrUid& wanted) const override {
            return wanted == Words::uid || Kit::Controller::hasInterface(wanted);
        }
        Host extra;
    };
    Both host;
    const Kit::ImportPolicy policy;
    Kit::detail::ImportLimits limits({}, {});
    std::vector<Kit::CompanionReport> companions;
    const std::wstring file;
    Kit::detail::ImportController controller(&host, policy, limits, file, companions);
    EXPECT_EQ(queryCast<Words>(&controller).get(), &host.extra);
    EXPECT_TRUE(controller.hasInterface(Words::uid));
    EXPECT_EQ(queryCast<QrProcessControl>(&controller).get(), &controller);
    EXPECT_FALSE(controller.hasInterface(QrUid{1, 2, 3, 4}));
}

// ---- Texts --------------------------------------------------------------------------------------

TEST_F(KitImportPolicy, DescribesAResult) {
    initialize();
    policy.deny = {gammaUid};
    EXPECT_EQ(Kit::describe(import("B=error")),
              L"input.a: the builder that accepted it made no object\n"
              L"  Alpha: declined by content\n"
              L"  Beta: accepted it, but made no object: line 1: bad; line 2: worse\n"
              L"  Gamma: not asked: the policy denies it");
    policy.companions = Kit::Companions::none;
    EXPECT_THAT(toNarrow(Kit::describe(import("A=find x.m")), '?'),
                HasSubstr("\n  companion x.m: not found: the policy permits no companion files"));
}

TEST(KitImportTexts, DifferForEachEndAndAnswer) {
    std::map<std::wstring, int> texts;
    for (int end = 0; end <= static_cast<int>(Kit::ImportEnd::declined); ++end)
        ++texts[Kit::describe(static_cast<Kit::ImportEnd>(end))];
    EXPECT_EQ(texts.size(), 7U);
    texts.clear();
    for (int answer = 0; answer <= static_cast<int>(Answer::took); ++answer)
        ++texts[Kit::describe(static_cast<Answer>(answer))];
    EXPECT_EQ(texts.size(), 8U);
    // Of a later version.
    EXPECT_STREQ(Kit::describe(static_cast<Kit::ImportEnd>(100)), L"no builder accepted it");
    EXPECT_STREQ(Kit::describe(static_cast<Answer>(100)), L"took it");
}

} // namespace
