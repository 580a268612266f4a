// SPDX-License-Identifier: BSL-1.0
/// Tests that no importer harms the host, and that the verdict on each is true: importers that end,
/// hang or exhaust their process, importers that lie to the host, and one that trusts its input, on
/// mutated files.
#include "tests/guarding/guardingFixture.h"

#include <cstdlib>
#include <map>
#include <optional>
#include <random>
#include <set>

using namespace Mz;
using namespace Mz::Test;
using Kit::GuardedImport;
using Kit::ImportVerdict;

namespace {

using Verdicts = std::map<std::string, ImportVerdict>;

Verdicts ending() {
    using enum ImportVerdict;
    // On Windows a raised signal is not a fault: the C library ends the process.
    constexpr ImportVerdict raised = MZ_RAISE_CRASHES ? crashed : exited;
    // Wine grants any request, and counts it as used.
    constexpr ImportVerdict requested = MZ_REQUESTED;
    // With the sanitizers it ends the process; else it is out of memory after it used much.
    constexpr ImportVerdict eaten = requested == exited ? exited : outOfMemory;
    return {
        {"crash", crashed},         {"recurse", crashed},
        {"divide", crashed},        {"trap", crashed},
        {"raiseSegv", raised},      {"crashInThread", crashed},
        {"killSelf", crashed},      {"abort", aborted},
        {"terminate", aborted},     {"throwInNoexcept", aborted},
        {"throwInThread", aborted}, {"exit", exited},
        {"exitWithStatus", exited}, {"quickExit", exited},
        {"exitInThread", exited},   {"exitAsTheProbe", answerLost},
        {"eatMemory", outOfMemory}, {"requestTooMuch", requested},
        {"eatAndRequest", eaten},   {"throwStandard", threw},
        {"throwUnknown", threw},    {"throwNumber", threw},
    };
}

Verdicts hanging() {
    using enum ImportVerdict;
    return {{"hang", timedOut},
            {"sleep", timedOut},
            {"freeze", timedOut},
            {"hangInThread", timedOut},
            {"progressForever", timedOut}};
}

Verdicts lying() {
    using enum ImportVerdict;
    return {
        {"garbage", garbled},
        {"garbageForever", garbled},
        {"halfFrame", timedOut},
        {"wrongSum", garbled},
        {"wrongKind", garbled},
        {"taskKind", garbled},
        {"longPayload", garbled},
        {"hugeLength", garbled},
        {"longText", garbled},
        {"nulInText", garbled},
        {"wrongFlag", garbled},
        {"unknownFunction", garbled},
        {"verdictOfTheHost", garbled},
        {"unknownVerdict", garbled},
        {"importedNothing", answerRejected},
        {"importedGarbage", answerRejected},
        {"importedUnknownClass", answerRejected},
        {"importedMore", answerRejected},
        {"importedForged", imported},
        {"hugeAnswer", answerTooLong},
        {"callsWithoutReading", tooManyCalls},
        {"closePipes", answerLost},
        {"closeEverything", answerLost},
        {"messagesForever", tooManyCalls},
        {"warningsForever", tooManyCalls},
        {"searchForever", tooManyCalls},
    };
}

Verdicts harmless() {
    using enum ImportVerdict;
    return {{"print", imported},
            {"otherLocale", imported},
            {"leaveThread", imported},
            {"longMessage", imported},
            {"otherController", imported},
            {"endParent", imported},
            {"swallowBadAlloc", MZ_REQUESTED == threw ? imported : MZ_REQUESTED}};
}

class HostileImport : public Guarding {
  protected:
    HostileImport() {
        limits.memory = std::uint64_t{200} << 20;
        limits.answer = std::uint64_t{8} << 20;
        limits.calls = 1000;
    }

    /// Expects the verdicts of importers that perform the acts in one phase.
    void expect(const std::string& phase, const Verdicts& verdicts) {
        for (const auto& [act, verdict] : verdicts) {
            SCOPED_TRACE(phase + " " + act);
            limits.time = std::chrono::milliseconds(
                verdict == ImportVerdict::timedOut ? MZ_SHORT_TIME : 60'000);
            const GuardedImport import = this->import(phase + " " + act);
            EXPECT_EQ(import.verdict, verdict) << displayed(import);
            EXPECT_EQ(static_cast<bool>(import.object), verdict == ImportVerdict::imported);
            if (const QrPtr<Parcel> parcel = parcelOf(import))
                parcel->first.reset(), parcel->second.reset();
            EXPECT_FALSE(hasChildProcess());
        }
    }

    static std::string displayed(const GuardedImport& import) {
        const std::wstring text = import.sentence();
        return std::string(text.begin(), text.end());
    }
};

TEST_F(HostileImport, EndsItsProcessAlone) {
    expect("importing", ending());
}

TEST_F(HostileImport, IsStoppedWhenItHangs) {
    expect("importing", hanging());
}

TEST_F(HostileImport, CannotLieToTheHost) {
    expect("importing", lying());
}

TEST_F(HostileImport, MayDoWhatHarmsNobody) {
    expect("importing", harmless());
}

TEST_F(HostileImport, IsNamedInEveryPhase) {
    const std::set<std::string> slow{"eatMemory", "eatAndRequest", "recurse"};
    Verdicts verdicts = ending();
    std::erase_if(verdicts, [&](const auto& entry) { return slow.contains(entry.first); });
    expect("asking", verdicts);
    expect("storing", verdicts);
    const GuardedImport asking = import("asking crash");
    EXPECT_EQ(asking.activity, L"canImport of \"Hostile\"");
    EXPECT_EQ(import("importing crash").activity, L"the import by \"Hostile\"");
    EXPECT_EQ(import("storing crash").activity, L"the storing of the object of \"Hostile\"");
    EXPECT_EQ(import("storing throwOwn").verdict, ImportVerdict::notStored);
    EXPECT_EQ(import("importing throwOwn").verdict, ImportVerdict::threw);
}

/// What the careless importer does with these bytes.
ImportVerdict carelessVerdict(const std::string& content) {
    for (const char byte : content) {
        const auto value = static_cast<unsigned char>(byte);
        if (value >= 0xF0)
            return ImportVerdict::aborted;
        if (value >= 0xE0)
            return ImportVerdict::exited;
        if (value >= 0xC0)
            return ImportVerdict::threw;
        if (value >= 0x80)
            return ImportVerdict::crashed;
    }
    return ImportVerdict::imported;
}

/// `MZ_GUARDED_FILES` sets the number of files.
TEST_F(HostileImport, SurvivesMutatedFiles) {
    const char* const wanted = std::getenv("MZ_GUARDED_FILES");
    const int count = wanted ? std::atoi(wanted) : MZ_MUTATED_FILES;
    std::mt19937 random(20);
    std::map<ImportVerdict, int> seen;
    for (int number = 0; number < count; ++number) {
        std::string content(64, 'a');
        for (unsigned int changes = random() % 4; changes > 0; --changes)
            content[random() % content.size()] = static_cast<char>(1 + random() % 255);
        SCOPED_TRACE(number);
        const GuardedImport import = this->import("careless " + content);
        ASSERT_EQ(import.verdict, carelessVerdict(content)) << displayed(import);
        if (import) {
            ASSERT_EQ(parcelOf(import)->text, std::wstring(content.begin(), content.end()));
        }
        ++seen[import.verdict];
    }
    EXPECT_FALSE(hasChildProcess());
    EXPECT_EQ(seen.size(), 5u);
}

} // namespace
