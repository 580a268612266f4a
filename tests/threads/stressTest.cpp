// SPDX-License-Identifier: BSL-1.0
// Uses everything that threads may use at the same time, on many threads at once: created objects,
// casts, references, controllers, streams under a locale with a comma, lookups of translators. Few
// rounds in most builds; enough for half a minute in the build with ThreadSanitizer, which reports
// a data race even if no value is wrong.
#include "components/componentKit/controller.h"
#include "components/componentKit/hostKit.h"
#include "components/componentKit/object.h"
#include "components/componentManager/translation.h"
#include "tests/kit/shapes.h"
#include "tests/streams/commaLocale.h"
#include "tests/streams/support.h"

#include <gtest/gtest.h>

#include <atomic>
#include <filesystem>
#include <thread>
#include <vector>

using namespace Mz;
using namespace Mz::Test;

namespace {

constexpr int threadCount = 8;
constexpr int rounds = MZ_STRESS_ROUNDS;

/// Supplies a tone for objects that have none.
class Tone final : public QrCastImpl<Tone, Sounding> {
  public:
    int tone() const override { return 440; }
};

bool acceptsSounding(const QrUid& uid) {
    return uid == Sounding::uid;
}

/// A controller that all threads ask at once.
class Answering final : public Kit::Controller {
  public:
    bool isInterrupted() override {
        ++questions;
        return false;
    }

    std::atomic<int> questions = 0;
};

/// What the threads share. The first use of a builder loads its library, which threads must not do
/// at once, so each builder has made an object before they start.
struct Shared {
    QrRefPtr<Shape> shape = Kit::create<Shape>(redSquareUid);
    Tone tone;
    QrRefPtr<Shape> five = Kit::create<Shape>(fiveUid);
    QrCastable* translated = Kit::create<Shape>(squareUid).detach();
    Answering controller;
};

/// Creates objects, each of which only its thread uses, and copies references to a shared one.
bool createsAndCounts(const Shared& shared) {
    const QrRefPtr<Shape> own = Kit::create<Shape>(fiveUid);
    const QrRefPtr<Shape> again = shared.shape;
    return own && own->corners() == 5 && again->corners() == 4;
}

/// Casts a shared object, to what it has, to what it lacks, and to what its translator supplies.
bool casts(const Shared& shared) {
    const auto coloured = queryCast<Coloured>(shared.shape.get());
    const auto sounding = queryCast<Sounding>(shared.shape.get());
    const auto translated = queryCast<Sounding>(shared.translated);
    return coloured && coloured->colour() == "red" && !sounding && translated &&
           translated->tone() == 440;
}

/// Installs a controller of the thread and asks that and the shared one.
bool controls() {
    Answering own;
    {
        const Kit::ControllerScope scope(own, Kit::ControllerScope::thread);
        if (QrGetProcessController()->isInterrupted())
            return false;
    }
    return own.questions == 1 && !QrGetProcessController()->isInterrupted();
}

bool streams(int round) {
    const double value = round * 0.25;
    Reading<QrTextStream> text(written<QrTextStream>([&](QrStream& s) { s << value << round; }));
    Reading<QrBinaryStream> binary(written<QrBinaryStream>([&](QrStream& s) { s << value; }));
    double fromText = -1, fromBinary = -1;
    int number = -1;
    text.stream >> fromText >> number;
    binary.stream >> fromBinary;
    return fromText == value && fromBinary == value && number == round;
}

} // namespace

TEST(Threads, UseWhatTheyMayUseAtOnce) {
    Kit::initialize(std::filesystem::path(MZ_BUILD_PATH) / "components" / "kit");
    const CommaLocale locale;
    Shared shared;
    ASSERT_TRUE(shared.shape && shared.translated);
    QrAddTranslation(shared.translated, &shared.tone, acceptsSounding);
    const Kit::ControllerScope scope(shared.controller);

    std::atomic<int> wrong = 0;
    std::vector<std::thread> threads;
    for (int thread = 0; thread < threadCount; ++thread)
        threads.emplace_back([&] {
            for (int round = 0; round < rounds; ++round)
                wrong += createsAndCounts(shared) && casts(shared) && controls() && streams(round)
                             ? 0
                             : 1;
        });
    for (std::thread& thread : threads)
        thread.join();

    QrRemoveTranslation(shared.translated, &shared.tone);
    shared.translated->release();
    EXPECT_EQ(wrong, 0);
    EXPECT_EQ(shared.controller.questions, threadCount * rounds);
}
