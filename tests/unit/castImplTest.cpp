// SPDX-License-Identifier: BSL-1.0
// Tests the implementation templates: answers to casts, reference counts, destruction, companions,
// chains, and objects with several interfaces.
#include "tests/unit/testObjects.h"

#include <gtest/gtest.h>

#include <atomic>
#include <thread>

using namespace Mz;
using namespace Mz::Test;

namespace {

constexpr QrUid rootUid{0, 0, 0, 0};
constexpr QrUid plainGaugeUid{0x3C5A0011, 0x51C24E0B, 0x8F3D6A70, 0x1B9E0C55};

class PlainGauge : public QrCastImpl<PlainGauge, Gauge, const PlainGauge&> {
  public:
    int value() const override { return 3; }
};

class PlainFineGauge : public QrCastImpl<PlainFineGauge, FineGauge, const PlainFineGauge&> {
  public:
    int value() const override { return 4; }
};

TEST(Uid, IsComparedWordByWord) {
    constexpr QrUid uid{1, 2, 3, 4};
    EXPECT_TRUE(uid == (QrUid{1, 2, 3, 4}));
    EXPECT_FALSE(uid == (QrUid{9, 2, 3, 4}));
    EXPECT_FALSE(uid == (QrUid{1, 9, 3, 4}));
    EXPECT_FALSE(uid == (QrUid{1, 2, 9, 4}));
    EXPECT_FALSE(uid == (QrUid{1, 2, 3, 9}));
    EXPECT_TRUE(uid != (QrUid{1, 2, 3, 9}));
}

TEST(Uid, IdentifiersThatDifferInTheFirstWordAloneAreUnequal) {
    constexpr QrUid io{0x81C8DF23, 0xA78111D1, 0x988A4445, 0x53540000};
    constexpr QrUid persistant{0x81C8DF24, 0xA78111D1, 0x988A4445, 0x53540000};
    EXPECT_FALSE(io == persistant);
}

TEST(UncountedObject, IsNeverDeletedByRelease) {
    PlainGauge gauge;
    for (int round = 0; round < 100; ++round) {
        EXPECT_EQ(gauge.release(), 1);
        EXPECT_EQ(gauge.newReference(), 1);
        EXPECT_EQ(gauge.release(), 1);
        gauge.destroy();
    }
    EXPECT_EQ(gauge.value(), 3);
}

TEST(QrCastImpl, AnswersItsOneInterfaceAtItsOwnAddress) {
    PlainGauge gauge;
    QrCastable* const answer = gauge.getInterface(Gauge::uid);
    EXPECT_EQ(answer, &gauge);
    EXPECT_EQ(static_cast<void*>(static_cast<Gauge*>(answer)), static_cast<void*>(&gauge));
    EXPECT_TRUE(gauge.hasInterface(Gauge::uid));
}

TEST(QrCastImpl, AnswersNothingElse) {
    PlainGauge gauge;
    for (const QrUid& uid : {rootUid, plainGaugeUid, Dial::uid, FineGauge::uid, unknownUid}) {
        EXPECT_EQ(gauge.getInterface(uid), nullptr);
        EXPECT_FALSE(gauge.hasInterface(uid));
    }
}

TEST(QrCastImpl, DoesNotAnswerForAnInterfaceAboveItsOwn) {
    PlainFineGauge gauge;
    EXPECT_EQ(gauge.getInterface(Gauge::uid), nullptr);
    EXPECT_FALSE(gauge.hasInterface(Gauge::uid));
    EXPECT_EQ(gauge.getInterface(FineGauge::uid), &gauge);
}

TEST(QrCastImpl, IsItsOwnPrincipalObject) {
    PlainGauge gauge;
    const PlainGauge& constant = gauge;
    EXPECT_EQ(gauge.getCastable(), &gauge);
    EXPECT_EQ(constant.getCastable(), &gauge);
}

TEST(QrCastImpl, TakesExactlyOneReferenceForAnAnswerAndNoneOtherwise) {
    Probe probe;
    EXPECT_NE(probe.getInterface(Gauge::uid), nullptr);
    EXPECT_EQ(probe.references, 1);
    EXPECT_EQ(probe.getInterface(Dial::uid), nullptr);
    EXPECT_TRUE(probe.hasInterface(Gauge::uid));
    EXPECT_FALSE(probe.hasInterface(Dial::uid));
    EXPECT_EQ(probe.references, 1);
}

/// A final class that does not count. The template can omit the call that takes a reference; the
/// final classes below count, so there it must not.
class FinalGauge final : public QrCastImpl<FinalGauge, Gauge> {
  public:
    int value() const override { return 1; }
};

class FinalCounting final : public QrCastImpl<FinalCounting, Gauge> {
  public:
    int value() const override { return 2; }
    long newReference() override { return ++references; }
    long references = 0;
};

class FinalCounted final : public QrCastRef<QrCastHeap<QrCastImpl<FinalCounted, Gauge>>> {
  public:
    int value() const override { return 3; }
};

class FinalMulti final : public QrCastRef<QrCastHeap<QrCastMulti<FinalMulti, Gauge, Dial>>> {
  public:
    int value() const override { return 4; }
    int mark() const override { return 5; }
};

TEST(FinalClass, TakesTheReferenceOfAnAnswerLikeAnyOther) {
    FinalGauge gauge;
    EXPECT_EQ(gauge.getInterface(Gauge::uid), &gauge);
    FinalCounting counting;
    EXPECT_EQ(counting.getInterface(Gauge::uid), &counting);
    EXPECT_EQ(counting.references, 1);
    auto* const counted = new FinalCounted;
    EXPECT_EQ(counted->getInterface(Gauge::uid), counted);
    EXPECT_EQ(counted->newReference(), 1);
    EXPECT_EQ(counted->release(), 0);
    EXPECT_EQ(counted->release(), -1);
    auto* const multi = new FinalMulti;
    QrCastable* const dial = multi->getInterface(Dial::uid);
    EXPECT_EQ(static_cast<Dial*>(dial)->mark(), 5);
    EXPECT_EQ(dial->newReference(), 1);
    EXPECT_EQ(dial->release(), 0);
    EXPECT_EQ(dial->release(), -1);
}

/// Counts, but only callers that know it by an interface can do so. The template cannot see this
/// override and must call it virtually.
class PrivateGauge : public QrCastImpl<PrivateGauge, Gauge> {
  public:
    int value() const override { return taken; }

  private:
    long newReference() override { return ++taken; }

    int taken = 0;
};

class PrivateMulti final : public QrCastMulti<PrivateMulti, Gauge, Dial> {
  public:
    int value() const override { return taken; }
    int mark() const override { return taken; }

  private:
    long newReference() override { return ++taken; }

    int taken = 0;
};

/// Has an overload of `newReference` that makes a direct call ambiguous.
class AmbiguousGauge final : public QrCastImpl<AmbiguousGauge, Gauge> {
  public:
    int value() const override { return taken; }
    long newReference() override { return ++taken; }
    long newReference(int count) { return taken += count; }

  private:
    int taken = 0;
};

TEST(PrivateCounting, IsAskedForEachAnswerAndNoOther) {
    const auto takenOf = [](auto& object, const QrUid& uid) {
        QrCastable* const principal = object.getCastable();
        EXPECT_NE(principal->getInterface(uid), nullptr);
        EXPECT_EQ(principal->getInterface(rootUid), nullptr);
        return object.value();
    };
    PrivateGauge gauge;
    EXPECT_EQ(takenOf(gauge, Gauge::uid), 1);
    PrivateMulti multi;
    EXPECT_EQ(takenOf(multi, Gauge::uid), 1);
    EXPECT_EQ(takenOf(multi, Dial::uid), 2);
    AmbiguousGauge ambiguous;
    EXPECT_EQ(takenOf(ambiguous, Gauge::uid), 1);
}

class CountingBehind : public PlainGauge {
  public:
    long newReference() override { return ++references; }
    long references = 0;
};

TEST(QrCastImpl, AsksAClassDerivedFromItsImplementationToCount) {
    CountingBehind gauge;
    EXPECT_EQ(gauge.getInterface(Gauge::uid), &gauge);
    EXPECT_EQ(gauge.references, 1);
}

class HeapGauge : public QrCastHeap<QrCastImpl<HeapGauge, Gauge>> {
  public:
    explicit HeapGauge(bool& gone) : gone(gone) {}
    ~HeapGauge() override { gone = true; }
    int value() const override { return 5; }

  private:
    bool& gone;
};

TEST(QrCastHeap, DestroyDeletesThroughTheVirtualDestructor) {
    bool gone = false;
    QrCastable* const gauge = new HeapGauge(gone);
    EXPECT_EQ(gauge->newReference(), 1);
    EXPECT_EQ(gauge->release(), 1);
    EXPECT_FALSE(gone);
    gauge->destroy();
    EXPECT_TRUE(gone);
}

TEST(QrCastRef, CountsFromMinusOneAndDeletesBelowZero) {
    int alive = 0;
    QrCastable* const object = new Counted(alive);
    EXPECT_EQ(object->newReference(), 0);
    EXPECT_EQ(object->newReference(), 1);
    EXPECT_EQ(object->release(), 0);
    EXPECT_EQ(alive, 1);
    EXPECT_EQ(object->release(), -1);
    EXPECT_EQ(alive, 0);
}

TEST(QrCastRef, ReleaseOfANeverReferencedObjectDeletesIt) {
    int alive = 0;
    EXPECT_EQ((new Counted(alive))->release(), -2);
    EXPECT_EQ(alive, 0);
}

TEST(QrCastRef, ACopyStartsWithoutReferences) {
    int alive = 0;
    auto* const object = new Counted(alive);
    EXPECT_EQ(object->newReference(), 0);
    EXPECT_EQ(object->newReference(), 1);
    auto* const copy = new Counted(*object);
    EXPECT_EQ(copy->newReference(), 0);
    EXPECT_EQ(copy->release(), -1);
    EXPECT_EQ(alive, 1);
    EXPECT_EQ(object->release(), 0);
    EXPECT_EQ(object->release(), -1);
}

TEST(QrCastRef, GetInterfaceTakesACountedReference) {
    int alive = 0;
    auto* const object = new Counted(alive);
    EXPECT_EQ(object->getInterface(Gauge::uid), object);
    EXPECT_EQ(object->getInterface(Dial::uid), nullptr);
    EXPECT_EQ(object->release(), -1);
    EXPECT_EQ(alive, 0);
}

TEST(QrCastRef, CountsExactlyUnderManyThreads) {
    constexpr int rounds = 100000;
    constexpr long threadCount = 4;
    int alive = 0;
    auto* const object = new Counted(alive);
    object->newReference();
    std::atomic<bool> go = false;
    std::vector<std::thread> threads;
    for (long index = 0; index < threadCount; ++index) {
        object->newReference(); // The thread releases it last.
        threads.emplace_back([&] {
            while (!go)
                std::this_thread::yield();
            for (int round = 0; round < rounds; ++round) {
                object->newReference();
                object->release();
            }
            object->release();
        });
    }
    go = true;
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(object->newReference(), 1);
    EXPECT_EQ(object->release(), 0);
    EXPECT_EQ(alive, 1);
    EXPECT_EQ(object->release(), -1);
    EXPECT_EQ(alive, 0);
}

TEST(QrCastRef, ExactlyOneOfManyThreadsDeletes) {
    for (int attempt = 0; attempt < 200; ++attempt) {
        int alive = 0;
        auto* const object = new Counted(alive);
        constexpr int threadCount = 4;
        for (int index = 0; index < threadCount; ++index)
            object->newReference();
        std::atomic<int> ready = 0;
        std::atomic<int> deletions = 0;
        std::vector<std::thread> threads;
        for (int index = 0; index < threadCount; ++index)
            threads.emplace_back([&] {
                ++ready;
                while (ready != threadCount)
                    std::this_thread::yield();
                if (object->release() < 0)
                    ++deletions;
            });
        for (std::thread& thread : threads)
            thread.join();
        EXPECT_EQ(deletions, 1);
        EXPECT_EQ(alive, 0);
    }
}

TEST(LkCounter, DropsOnlyTheLast) {
    LkCounterWindows<long> counter(-1);
    EXPECT_FALSE(counter.dropLast());
    EXPECT_EQ(counter.value(), -1);
    ++counter;
    ++counter;
    EXPECT_FALSE(counter.dropLast());
    EXPECT_EQ(counter.value(), 1);
    --counter;
    EXPECT_TRUE(counter.dropLast());
    EXPECT_EQ(counter.value(), -1);
}

/// Takes a reference to itself while it is destroyed.
class TakenAtTheEnd final : public QrCastRef<QrCastHeap<QrCastImpl<TakenAtTheEnd, Dial>>> {
  public:
    explicit TakenAtTheEnd(long& counted) : result(counted) {}
    ~TakenAtTheEnd() override { result = newReference(); }
    int mark() const override { return 1; }

  private:
    long& result;
};

TEST(QrCastRef, CountsFromNoReferenceWhileItIsDestroyed) {
    long afterLast = 77;
    QrCastable* const held = new TakenAtTheEnd(afterLast);
    held->newReference();
    EXPECT_EQ(held->release(), -1);
    EXPECT_EQ(afterLast, 0);

    afterLast = 77;
    QrCastable* const neverHeld = new TakenAtTheEnd(afterLast);
    EXPECT_EQ(neverHeld->release(), -2);
    EXPECT_EQ(afterLast, -1);
}

TEST(LkCounter, IsThirtyTwoBitsWideAndReturnsTheNewValue) {
    LkCounterWindows<long> counter(-1);
    EXPECT_EQ(++counter, 0);
    EXPECT_EQ(++counter, 1);
    EXPECT_EQ(--counter, 0);
    EXPECT_EQ(--counter, -1);
    LkCounterWindows<long> full(2147483647L);
    EXPECT_EQ(++full, -2147483647L - 1);
    EXPECT_EQ(--full, 2147483647L);
}

// ---- Companions -----------------------------------------------------------------------------

class Owner;

/// The companion of `Owner`: supplies its `Dial`.
class Companion : public QrTempObject<Owner, QrCastRef<QrCastHeap<QrCastImpl<Companion, Dial>>>> {
  public:
    explicit Companion(Owner* owner);
    ~Companion() override;
    int mark() const override { return 11; }

  private:
    Log& log;
};

/// Counts references but is not deleted by `release`, so that the tests can log every step.
class Owner : public QrCastImpl2<Owner, Gauge, QrTempIface<Owner, Companion>> {
  public:
    int value() const override { return 6; }
    long newReference() override {
        log.push_back("take");
        return ++references;
    }
    long release() override {
        log.push_back("give");
        return --references;
    }
    void destroy() override { log.push_back("destroy owner"); }

    Log log;
    long references = 0;
};

Companion::Companion(Owner* owner) : QrTempObject(owner), log(owner->log) {
    log.push_back("new companion");
}
Companion::~Companion() {
    log.push_back("delete companion");
}

TEST(QrCastImpl2, AnswersItsInterfaceItselfAndLeavesOthersToTheNextLink) {
    Owner owner;
    EXPECT_EQ(owner.getInterface(Gauge::uid), &owner);
    EXPECT_EQ(owner.log, Log{"take"});
    EXPECT_TRUE(owner.hasInterface(Gauge::uid));
    EXPECT_TRUE(owner.hasInterface(Dial::uid));
    EXPECT_FALSE(owner.hasInterface(unknownUid));
    EXPECT_EQ(owner.getInterface(unknownUid), nullptr);
    EXPECT_EQ(owner.getCastable(), &owner);
    EXPECT_EQ(owner.log, Log{"take"}) << "hasInterface takes no reference and makes no companion";
}

TEST(QrTempIface, MakesACompanionWithOneReferenceThatHoldsTheOwner) {
    Owner owner;
    QrCastable* const companion = owner.getInterface(Dial::uid);
    ASSERT_NE(companion, nullptr);
    EXPECT_EQ(owner.log, (Log{"take", "new companion"}));
    EXPECT_EQ(static_cast<Dial*>(companion)->mark(), 11);
    EXPECT_EQ(companion->newReference(), 1) << "the returned reference is the first";
    EXPECT_EQ(companion->release(), 0);
    EXPECT_EQ(owner.references, 1);
    EXPECT_EQ(companion->release(), -1);
    EXPECT_EQ(owner.log, (Log{"take", "new companion", "delete companion", "give"}));
    EXPECT_EQ(owner.references, 0);
}

TEST(QrTempIface, MakesAFreshCompanionForEveryRequest) {
    Owner owner;
    const auto first = QrPtr<Dial>::adopt(safeCast<Dial>(&owner));
    const auto second = QrPtr<Dial>::adopt(safeCast<Dial>(&owner));
    EXPECT_NE(first.get(), second.get());
    EXPECT_EQ(owner.references, 2);
}

TEST(QrTempObject, ShowsTheOwnerAsThePrincipalObject) {
    Owner owner;
    const auto companion = QrPtr<Dial>::adopt(safeCast<Dial>(&owner));
    EXPECT_EQ(companion->getCastable(), &owner);
    EXPECT_EQ(QrCPtr<Dial>(companion)->getCastable(), &owner);
}

TEST(QrTempObject, AnswersForItselfAndPassesEverythingElseToTheOwner) {
    Owner owner;
    const auto companion = QrPtr<Dial>::adopt(safeCast<Dial>(&owner));
    owner.log.clear();
    const auto itself = QrPtr<QrCastable>::adopt(companion->getInterface(Dial::uid));
    EXPECT_EQ(itself.get(), companion.get()) << "returns itself, not another companion";
    EXPECT_EQ(owner.log, Log{});
    const auto gauge = QrPtr<QrCastable>::adopt(companion->getInterface(Gauge::uid));
    EXPECT_EQ(gauge.get(), &owner);
    EXPECT_EQ(owner.log, Log{"take"});
    EXPECT_EQ(companion->getInterface(unknownUid), nullptr);
    EXPECT_TRUE(companion->hasInterface(Dial::uid));
    EXPECT_TRUE(companion->hasInterface(Gauge::uid));
    EXPECT_FALSE(companion->hasInterface(unknownUid));
}

TEST(QrTempObject, DestroyHoldsTheOwnerWhileItDeletesTheCompanionAndAsksTheOwner) {
    Owner owner;
    QrCastable* const companion = owner.getInterface(Dial::uid);
    owner.log.clear();
    companion->destroy();
    EXPECT_EQ(owner.log, (Log{"take", "delete companion", "give", "destroy owner", "give"}));
    EXPECT_EQ(owner.references, 0);
}

class CountedOwner;

class CountedCompanion
    : public QrTempObject<CountedOwner, QrCastRef<QrCastHeap<QrCastImpl<CountedCompanion, Dial>>>> {
  public:
    using QrTempObject::QrTempObject;
    int mark() const override { return 12; }
};

class CountedOwner
    : public QrCastRef<
          QrCastImpl2<CountedOwner, Gauge, QrTempIface<CountedOwner, CountedCompanion>>> {
  public:
    explicit CountedOwner(int& alive) : alive(alive) { ++alive; }
    ~CountedOwner() override { --alive; }
    int value() const override { return 8; }

  private:
    int& alive;
};

TEST(QrTempObject, AloneKeepsACountedOwnerAlive) {
    int alive = 0;
    QrPtr<CountedOwner> owner(new CountedOwner(alive));
    auto companion = queryCast<Dial>(owner.get());
    owner.reset();
    EXPECT_EQ(alive, 1);
    EXPECT_EQ(queryCast<Gauge>(companion.get())->value(), 8);
    companion.reset();
    EXPECT_EQ(alive, 0);
}

TEST(QrTempObject, DestroyLetsACountedOwnerGoWithItsLastReference) {
    int alive = 0;
    QrPtr<CountedOwner> owner(new CountedOwner(alive));
    QrCastable* const companion = owner->getInterface(Dial::uid);
    owner.reset();
    companion->destroy();
    EXPECT_EQ(alive, 0);
}

// ---- A link of the chain alone --------------------------------------------------------------

struct NextLink {
    static QrCastable* getInterface(Gauge* object, const QrUid& uid) {
        if (!(uid == unknownUid))
            return nullptr;
        object->newReference();
        return object;
    }
    static bool hasInterface(const Gauge*, const QrUid& uid) { return uid == unknownUid; }
};

class Link : public QrCastHierarchy<Link, Gauge, NextLink> {
  public:
    const QrCastable* getCastable() const override { return this; }
    QrCastable* getCastable() override { return this; }
    void destroy() override {}
    int value() const override { return 9; }
};

static_assert(std::is_abstract_v<QrCastHierarchy<Link, Gauge, NextLink>>);

TEST(QrCastHierarchy, AnswersItsInterfaceAndPassesTheOthersOn) {
    Link link;
    EXPECT_EQ(link.getInterface(Gauge::uid), &link);
    EXPECT_EQ(link.getInterface(unknownUid), &link);
    EXPECT_EQ(link.getInterface(Dial::uid), nullptr);
    EXPECT_TRUE(link.hasInterface(Gauge::uid));
    EXPECT_TRUE(link.hasInterface(unknownUid));
    EXPECT_FALSE(link.hasInterface(Dial::uid));
}

// ---- Several interfaces ---------------------------------------------------------------------

class GaugeAndDial : public QrCastRef<QrCastHeap<QrCastMulti<GaugeAndDial, Gauge, Dial>>> {
  public:
    explicit GaugeAndDial(int& alive) : alive(alive) { ++alive; }
    ~GaugeAndDial() override { --alive; }
    int value() const override { return 21; }
    int mark() const override { return 22; }

  private:
    int& alive;
};

TEST(QrCastMulti, AnswersEachInterfaceWithTheRightView) {
    int alive = 0;
    QrPtr<GaugeAndDial> object(new GaugeAndDial(alive));
    auto gauge = queryCast<Gauge>(object->getCastable());
    auto dial = queryCast<Dial>(object->getCastable());
    EXPECT_EQ(gauge->value(), 21);
    EXPECT_EQ(dial->mark(), 22);
    EXPECT_EQ(gauge.get(), static_cast<Gauge*>(object.get()));
    EXPECT_EQ(dial.get(), static_cast<Dial*>(object.get()));
    EXPECT_EQ(object->getInterface(unknownUid), nullptr);
    EXPECT_TRUE(dial->hasInterface(Gauge::uid));
    EXPECT_TRUE(gauge->hasInterface(Dial::uid));
    EXPECT_FALSE(gauge->hasInterface(unknownUid));
    object.reset();
    gauge.reset();
    EXPECT_EQ(alive, 1);
    EXPECT_EQ(queryCast<Gauge>(dial.get())->value(), 21);
    dial.reset();
    EXPECT_EQ(alive, 0);
}

TEST(QrCastMulti, HasOnePrincipalObjectAndOneCounterForAllViews) {
    int alive = 0;
    auto* const object = new GaugeAndDial(alive);
    Dial* const dial = object;
    Gauge* const gauge = object;
    EXPECT_EQ(dial->getCastable(), gauge->getCastable());
    EXPECT_EQ(dial->newReference(), 0);
    EXPECT_EQ(gauge->newReference(), 1);
    EXPECT_EQ(dial->release(), 0);
    EXPECT_EQ(gauge->release(), -1);
    EXPECT_EQ(alive, 0);
}

/// Not counted, as a static object.
class PlainMulti final : public QrCastMulti<PlainMulti, Gauge, Dial> {
  public:
    explicit PlainMulti(int& count) : alive(count) { ++alive; }
    ~PlainMulti() override { --alive; }
    int value() const override { return 31; }
    int mark() const override { return 32; }

  private:
    int& alive;
};

TEST(QrCastMulti, IgnoresDestroyUnlessItIsOnTheHeap) {
    int alive = 0;
    {
        PlainMulti object(alive);
        static_cast<Gauge&>(object).destroy();
        static_cast<Dial&>(object).destroy();
        EXPECT_EQ(alive, 1);
        EXPECT_EQ(object.value() + object.mark(), 63);
    }
    EXPECT_EQ(alive, 0);
}

TEST(QrCastMulti, DestroyThroughAnyViewDeletesTheWhole) {
    int alive = 0;
    Dial* const dial = new GaugeAndDial(alive);
    dial->destroy();
    EXPECT_EQ(alive, 0);
}

} // namespace
