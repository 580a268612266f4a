// SPDX-License-Identifier: BSL-1.0
/// What the rules of libraries and their descriptions say where a whole check would take another
/// path, and that each rule bears a library that answers nothing.
#include "tests/checks/obedientLibrary.h"

#include "components/componentTools/checking/allocationLimit.h"
#include "tests/support/temporaryDirectory.h"

#include <algorithm>
#include <condition_variable>
#include <fstream>
#include <map>
#include <mutex>
#include <thread>

using namespace Mz;
using namespace Mz::Tools;
using namespace Mz::Test;
using ::testing::AllOf;
using ::testing::ElementsAre;
using ::testing::EndsWith;
using ::testing::HasSubstr;
using ::testing::IsEmpty;
using ::testing::Pair;
using ::testing::StartsWith;

namespace {

/// Allows every allocation, and says that the first ones of each call failed.
class CountedLimit {
  public:
    CountedLimit() { setAllocationLimit(&limit); }
    ~CountedLimit() { setAllocationLimit(nullptr); }

    /// The numbers of allocations that were allowed, in order.
    inline static std::vector<int> allowed;

  private:
    static constexpr AllocationLimit limit{[](int count) { allowed.push_back(count); },
                                           [] { return allowed.back() < 2; }};
};

TEST(RulesForALibraryThatIsMissing, SayOnlyThatItIsMissing) {
    const CountedLimit limited;
    const TemporaryDirectory folder;
    CheckTask task;
    task.file = folder.path() / "missing.library";
    task.threadSafe = true;
    std::map<std::string, std::string> found;
    for (const RuleEntry& entry : ruleEntries()) {
        if (!entry.check)
            continue;
        CheckReport report;
        CheckSender sender([&](std::string message) { decodeReport(message, report); });
        CheckContext context(task, sender);
        context.begin(entry.facts);
        entry.check(context);
        EXPECT_TRUE(report.skipped.empty()) << entry.facts.id;
        for (const CheckFinding& finding : report.findings)
            found[finding.rule->id] += toUtf8(finding.sentence);
    }
    EXPECT_THAT(found, ElementsAre(Pair("description-answers",
                                        "the entry point is not a function of this library. Define "
                                        "QrGetComponentDescription in the library itself."),
                                   Pair("library-loads", StartsWith("it cannot be loaded: "))));
}

TEST(RulesForALibraryThatIsMissing, GetNoBuildersAndNoFunctions) {
    const TemporaryDirectory folder;
    CheckTask task;
    task.file = folder.path() / "missing.library";
    CheckReport report;
    CheckSender sender([&](std::string message) { decodeReport(message, report); });
    CheckContext context(task, sender);
    EXPECT_EQ(context.describedAs(scriptedUid(1)), nullptr);
    EXPECT_FALSE(context.builder({0, scriptedUid(1), L"scripted", L"place", nullptr}));
    EXPECT_FALSE(context.object({0, scriptedUid(1), L"scripted", L"place", nullptr}));
    EXPECT_EQ(context.function("MzRunComponentTest"), nullptr);
}

/// Returns prepared results of `newReference` and `release`.
class Counting final : public QrCastImpl<Counting, QrPersistant> {
  public:
    explicit Counting(std::vector<long> given) : results(std::move(given)) {}
    long newReference() override { return results.at(next++); }
    long release() override { return results.at(next++); }
    const QrUid* getClassUid() const override { return nullptr; }
    unsigned int getVersion() const override { return 0; }
    void write(QrStream&) override {}
    void read(QrStream&) override {}

  private:
    std::vector<long> results;
    std::size_t next = 0;
};

TEST(ReferenceCounts, AreValidIfBothFunctionsAgree) {
    const auto count = [](std::vector<long> results) {
        Counting object(std::move(results));
        return countOf(object);
    };
    const ReferenceCount counted = count({4, 5, 4, 3});
    EXPECT_TRUE(counted.counted && counted.valid);
    EXPECT_EQ(counted.value, 4);
    const ReferenceCount uncounted = count({1, 1, 1, 1});
    EXPECT_TRUE(!uncounted.counted && uncounted.valid);
    EXPECT_EQ(uncounted.value, 1);
    for (const std::vector<long>& wrong : {std::vector<long>{4, 6, 4, 3},
                                           {4, 5, 5, 3},
                                           {4, 5, 4, 4},
                                           {2, 2, 2, 2},
                                           {1, 1, 2, 1},
                                           {1, 1, 1, 0}})
        EXPECT_FALSE(count(wrong).valid) << ::testing::PrintToString(wrong);
}

class DescriptionRules : public ObedientLibrary {};

TEST_F(DescriptionRules, SeeNoFaultInAPlainDescription) {
    ScriptedBuilder one(1), two(2);
    description.builders = {&one, &two};
    for (const char* rule :
         {"description-answers", "description-counted", "description-stable",
          "description-enumerates", "description-count", "description-texts", "description-label",
          "uid-not-nil", "uid-unique", "uid-exact", "builder-made", "builder-interfaces",
          "builder-itself", "interfaces-agree", "castable-consistent", "references-balanced"})
        EXPECT_THAT(check(rule), IsEmpty()) << rule;
}

TEST_F(DescriptionRules, NameTheFirstFailureOfADescription) {
    class Failing final : public ScriptedDescription {
      public:
        unsigned int getBuilderCount() override { throw std::runtime_error("no count"); }
        QrEnum::Action enumerateBuilders(Builders&) override {
            throw std::runtime_error("no builders");
        }
    } failing;
    describe = [&] { return &failing; };
    EXPECT_THAT(check("description-answers"),
                ElementsAre("description-answers: the description throws: no count. Hosts drop all "
                            "builders of the library. Describe constants, and do nothing that can "
                            "fail."));
    EXPECT_THAT(check("description-count"), IsEmpty()) << "the finding of another rule";
    avoid(L"the description", {});
    EXPECT_THAT(
        check("description-answers"),
        ElementsAre(StartsWith("description-answers: enumerateBuilders throws: no builders. ")))
        << "a call that ended an earlier process is not repeated";
}

TEST_F(DescriptionRules, CountWhatIsNoBuilder) {
    ScriptedBuilder one;
    description.builders = {nullptr, &one, nullptr};
    EXPECT_THAT(check("description-answers"),
                ElementsAre(StartsWith("description-answers: enumerateBuilders passes 2 elements "
                                       "that are null or without QrBuilderDescription. ")));
    EXPECT_THAT(check("description-count"), IsEmpty());
}

TEST_F(DescriptionRules, CompareTheNumberOfBuilders) {
    class Several final : public ScriptedDescription {
      public:
        unsigned int getBuilderCount() override { return 2; }
    } several;
    ScriptedBuilder one;
    several.builders = {&one};
    describe = [&] { return &several; };
    EXPECT_THAT(check("description-count"),
                ElementsAre("description-count: getBuilderCount returns 2, but enumerateBuilders "
                            "passes 1 builder. Return the number of builders."));
}

TEST_F(DescriptionRules, NeedADescriptionAtEveryCall) {
    int calls = 0;
    describe = [&]() -> QrCastable* { return ++calls == 2 ? nullptr : &description; };
    EXPECT_THAT(check("description-counted"), IsEmpty()) << "the finding of another rule";
    EXPECT_EQ(calls, 2);
    calls = 1;
    EXPECT_THAT(check("description-counted"), IsEmpty());
    avoid(L"the entry point", {});
    EXPECT_THAT(check("description-counted"), IsEmpty()) << "a call that is not made";
    EXPECT_EQ(calls, 3);
    task.avoided.clear();
    calls = 1;
    EXPECT_THAT(check("description-stable"), IsEmpty());
    EXPECT_EQ(calls, 2);
    EXPECT_THAT(check("description-stable"), IsEmpty());
    calls = 0;
    EXPECT_THAT(
        check("description-stable"),
        ElementsAre(StartsWith("description-stable: the entry point returns null later. ")));
}

TEST_F(DescriptionRules, ExpectAnEnumerationToStop) {
    /// Returns the result of the first builder, but first passes the others or finishes.
    class Deaf final : public ScriptedDescription {
      public:
        QrEnum::Action enumerateBuilders(Builders& e) override {
            if (--goodCalls < 0)
                throw std::runtime_error("no builders");
            QrEnum::Action result{};
            for (QrBuilderDescription* builder : builders)
                result = e.process(QrCPtr<QrBuilderDescription>(builder));
            const QrEnum::Action last = finishes || !result ? e.finished() : result;
            return result ? result : last;
        }
        bool finishes = false;
        int goodCalls = 1000;
    } deaf;
    describe = [&] { return &deaf; };
    ScriptedBuilder one, two(2);
    deaf.builders = {&one};
    EXPECT_THAT(check("description-enumerates"), IsEmpty());
    const auto expectFault = [&] {
        EXPECT_THAT(check("description-enumerates"),
                    ElementsAre(StartsWith("description-enumerates: enumerateBuilders does not "
                                           "stop when process asks it to. ")));
    };
    deaf.finishes = true;
    expectFault();
    deaf.finishes = false;
    deaf.builders = {&one, &two};
    expectFault();
    deaf.goodCalls = 1;
    EXPECT_THAT(check("description-enumerates"), IsEmpty()) << "the finding of another rule";
    EXPECT_EQ(deaf.goodCalls, -1);
    avoid(L"enumerateBuilders", {});
    EXPECT_THAT(check("description-enumerates"), IsEmpty());
}

TEST_F(DescriptionRules, ExpectTheResultOfProcess) {
    class Other final : public ScriptedDescription {
      public:
        QrEnum::Action enumerateBuilders(Builders& e) override {
            const QrEnum::Action action = ScriptedDescription::enumerateBuilders(e);
            return static_cast<int>(action) == 42 ? QrEnum::Stop : action;
        }
    } other;
    ScriptedBuilder one;
    other.builders = {&one};
    describe = [&] { return &other; };
    EXPECT_THAT(check("description-enumerates"),
                ElementsAre(StartsWith("description-enumerates: enumerateBuilders does not stop")));
}

TEST_F(DescriptionRules, ExpectTheResultOfFinished) {
    ScriptedBuilder one;
    class Forgetful final : public ScriptedDescription {
      public:
        QrEnum::Action enumerateBuilders(Builders& e) override {
            const QrEnum::Action action = ScriptedDescription::enumerateBuilders(e);
            return static_cast<int>(action) == 77 ? QrEnum::Continue : action;
        }
    } forgetful;
    forgetful.builders = {&one};
    describe = [&] { return &forgetful; };
    EXPECT_THAT(
        check("description-enumerates"),
        ElementsAre(StartsWith("description-enumerates: enumerateBuilders does not end with")));
}

TEST_F(DescriptionRules, ReportAUidThatSeveralBuildersHaveOnce) {
    ScriptedBuilder one, two, three, other(4);
    description.builders = {&one, &two, &three, &other};
    EXPECT_THAT(check("uid-unique"), ElementsAre(StartsWith("uid-unique: another builder of this "
                                                            "library has the same uid")));
}

TEST_F(DescriptionRules, LetBuildersHaveUidsThatDifferInOneBit) {
    class Throwing final : public ScriptedDescription {
      public:
        QrRef<QrCastable> createBuilder(const QrUid& uid) override {
            if (QrRef<QrCastable> made = ScriptedDescription::createBuilder(uid))
                return made;
            throw std::runtime_error("no such builder");
        }
    } throwing;
    ScriptedBuilder two(2), three(3);
    throwing.builders = {&two, &three};
    describe = [&] { return &throwing; };
    const CheckReport report = reportOf("uid-exact");
    ASSERT_EQ(report.findings.size(), 2u) << "one for each builder, and none of this rule";
    EXPECT_STREQ(report.findings[0].rule->id, "exceptions-allowed");
    EXPECT_THAT(toUtf8(report.findings[0].sentence), StartsWith("createBuilder throws"));
}

TEST_F(DescriptionRules, AreCheckedForOneBuilderIfTheTaskNamesIt) {
    ScriptedBuilder one(1, L""), two(2);
    const auto refuse = [] { return QrRef<QrCastable>(); };
    one.create = two.create = refuse;
    description.builders = {&one, &two};
    task.builder = 1;
    const CheckReport report = reportOf("description-answers");
    ASSERT_EQ(report.builders.size(), 1u);
    EXPECT_EQ(report.builders[0].uid, scriptedUid(2));
}

class LibraryRules : public ObedientLibrary {};

TEST_F(LibraryRules, ListFiveOfTheExportedNames) {
    const std::vector<std::string> found = check("library-exports");
    ASSERT_EQ(found.size(), 1u);
    EXPECT_THAT(found[0],
                AllOf(StartsWith("library-exports: it exports 6 names besides its entry point: "
                                 "mzTest"),
                      EndsWith(", \u2026. Compile it with hidden visibility; mz_add_component "
                               "does.")));
    EXPECT_EQ(std::count(found[0].begin(), found[0].end(), ','), 5);
}

/// Keeps a thread and a file for each object that was made.
class Leavings {
  public:
    ~Leavings() {
        {
            const std::lock_guard lock(mutex);
            over = true;
        }
        ended.notify_all();
        for (std::thread& thread : threads)
            thread.join();
    }

    void add(bool withThread, bool withFile) {
        if (withThread)
            threads.emplace_back([this] {
                std::unique_lock lock(mutex);
                ended.wait(lock, [this] { return over; });
            });
        if (withFile)
            files.emplace_back(folder.write("file" + std::to_string(files.size()), "content"));
    }

  private:
    const TemporaryDirectory folder;
    std::vector<std::ifstream> files;
    std::vector<std::thread> threads;
    std::mutex mutex;
    std::condition_variable ended;
    bool over = false;
};

TEST_F(LibraryRules, NameThreadsAndFilesThatAreLeft) {
    Leavings leavings;
    ScriptedBuilder one;
    one.create = [&] {
        leavings.add(true, true);
        return nullptr;
    };
    description.builders = {&one};
    EXPECT_THAT(check("library-leaves"),
                ElementsAre(AllOf(StartsWith("library-leaves: after 3 times of use it leaves 3 "
                                             "threads and "),
                                  HasSubstr(" open "), HasSubstr(" behind. End and close them"))));
}

TEST_F(LibraryRules, NameOneThreadThatIsLeft) {
    Leavings leavings;
    ScriptedBuilder one;
    int objects = 0;
    one.create = [&] {
        if (++objects == 3)
            leavings.add(true, false);
        return nullptr;
    };
    description.builders = {&one};
    EXPECT_THAT(
        check("library-leaves"),
        ElementsAre(StartsWith("library-leaves: after 3 times of use it leaves 1 thread ")));
}

TEST_F(LibraryRules, UseALibraryOnlyAsFarAsItAnswers) {
    ScriptedBuilder one, two(2);
    int made = 0;
    one.create = [&]() -> QrRef<QrCastable> {
        ++made;
        throw std::runtime_error("no object");
    };
    two.create = one.create;
    description.builders = {&one, &two};
    EXPECT_THAT(check("library-leaves"),
                ElementsAre(StartsWith("exceptions-allowed: createObject throws an exception")));
    EXPECT_EQ(made, 4) << "one object for each use";
    class Breaking final : public ScriptedDescription {
      public:
        QrEnum::Action enumerateBuilders(Builders& e) override {
            ScriptedDescription::enumerateBuilders(e);
            throw std::runtime_error("too late");
        }
    } breaking;
    breaking.builders = {&one};
    describe = [&] { return &breaking; };
    EXPECT_THAT(check("library-leaves"), IsEmpty());
    describe = [] { return nullptr; };
    EXPECT_THAT(check("library-leaves"), IsEmpty());
    describe = []() -> QrCastable* { throw std::runtime_error("no description"); };
    EXPECT_THAT(check("library-leaves"), IsEmpty());
    EXPECT_EQ(made, 4);
}

TEST_F(LibraryRules, RunItsTestsOnlyIfItDescribesItself) {
    int tests = 0;
    runTest = [&](int number, Kit::TestReport& report) {
        ++tests;
        report.begin(L"first");
        report.require(number != 0, L"it is the first");
        return number < 2;
    };
    EXPECT_THAT(check("own-tests"), ElementsAre("own-tests: it is the first."));
    EXPECT_EQ(tests, 3);
    avoid(L"test 2", {});
    EXPECT_THAT(check("own-tests"), ElementsAre("own-tests: it is the first."));
    EXPECT_EQ(tests, 4) << "the second ended an earlier process";
    describe = [] { return nullptr; };
    EXPECT_THAT(check("own-tests"), IsEmpty());
    EXPECT_EQ(tests, 4);
}

class SurroundingRules : public ObedientLibrary {};

TEST_F(SurroundingRules, FailOneMoreAllocationUntilNoneFails) {
    const CountedLimit limited;
    CountedLimit::allowed.clear();
    ScriptedBuilder one;
    int objects = 0;
    one.create = [&] {
        ++objects;
        return nullptr;
    };
    description.builders = {&one};
    EXPECT_THAT(check("allocation-failure"), IsEmpty());
    EXPECT_EQ(objects, 3);
    EXPECT_THAT(CountedLimit::allowed, ElementsAre(0, -1, 1, -1, 2, -1, 0, -1, 1, -1, 2, -1))
        << "of objects, then of builders";
    avoid(L"createObject", placeOf(1));
    EXPECT_THAT(check("allocation-failure"), IsEmpty());
    EXPECT_EQ(objects, 3);
}

} // namespace
