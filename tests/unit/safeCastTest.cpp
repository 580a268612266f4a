// SPDX-License-Identifier: BSL-1.0
// Tests safeCast and queryCast: references, failures, translators, and the types that they accept.
#include "tests/unit/testObjects.h"

#include <gtest/gtest.h>

#include <functional>
#include <type_traits>

using namespace Mz;
using namespace Mz::Test;

namespace {

class PlainDial : public QrCastImpl<PlainDial, Dial> {
  public:
    int mark() const override { return 5; }
    QrCastable* getInterface(const QrUid& uid) override {
        ++asked;
        return QrCastImpl<PlainDial, Dial>::getInterface(uid);
    }
    long newReference() override { return ++references; }
    long release() override { return --references; }

    int asked = 0;
    long references = 0;
};

bool acceptsDial(const QrUid& uid) {
    return uid == Dial::uid;
}

bool acceptsEverything(const QrUid&) {
    return true;
}

/// Registers a translator while it lives.
class Translation {
  public:
    Translation(QrCastable* object, QrCastable* translator, bool (*accepts)(const QrUid&))
        : object(object), translator(translator) {
        QrAddTranslation(object, translator, accepts);
    }
    ~Translation() { QrRemoveTranslation(object, translator); }
    Translation(const Translation&) = delete;
    Translation& operator=(const Translation&) = delete;

  private:
    QrCastable* object;
    QrCastable* translator;
};

void expectBadCast(const std::function<void()>& cast) {
    try {
        cast();
        ADD_FAILURE() << "ExBadCast was not thrown";
    } catch (const QrComponentManagerEx::ExBadCast& badCast) {
        EXPECT_STREQ(badCast.getReason(), "Bad cast in QrCastable::safeCast");
        EXPECT_STREQ(badCast.what(), "Bad cast in QrCastable::safeCast");
        EXPECT_STREQ(badCast.getDetailedReason(),
                     "components/componentManager/cast(71): Bad cast in QrCastable::safeCast");
    }
}

TEST(SafeCast, GivesTheInterfaceWithOneReferenceThatTheCallerOwns) {
    Probe probe;
    Gauge* const gauge = safeCast<Gauge>(&probe);
    EXPECT_EQ(gauge, &probe);
    EXPECT_EQ(probe.references, 1);
    EXPECT_EQ(probe.asked, 1);
    gauge->release();
    EXPECT_EQ(probe.references, 0);
}

TEST(SafeCast, OfConstGivesConst) {
    Probe probe;
    const Probe& constant = probe;
    static_assert(std::is_same_v<decltype(safeCast<Gauge>(&constant)), const Gauge*>);
    static_assert(std::is_same_v<decltype(queryCast<Gauge>(&constant)), QrCPtr<Gauge>>);
    const auto gauge = QrCPtr<Gauge>::adopt(safeCast<Gauge>(&constant));
    EXPECT_EQ(probe.references, 1);
    EXPECT_EQ(queryCast<Gauge>(&constant), gauge);
    EXPECT_EQ(probe.references, 1);
}

TEST(SafeCast, OfNullIsABadCast) {
    expectBadCast([] { safeCast<Gauge>(static_cast<QrCastable*>(nullptr)); });
    expectBadCast([] { safeCast<Gauge>(static_cast<const QrCastable*>(nullptr)); });
    expectBadCast([] { safeCast<Gauge>(nullptr); });
    expectBadCast([] { safeCast<Gauge>(static_cast<Dial*>(nullptr)); });
}

int askedAcceptors = 0;

bool countsQuestions(const QrUid&) {
    ++askedAcceptors;
    return true;
}

TEST(SafeCast, OfNullAsksNobodyNotEvenTranslators) {
    Probe translator;
    const Translation translation(nullptr, &translator, countsQuestions);
    askedAcceptors = 0;
    expectBadCast([] { safeCast<Gauge>(static_cast<QrCastable*>(nullptr)); });
    EXPECT_FALSE(queryCast<Gauge>(nullptr));
    EXPECT_EQ(askedAcceptors, 0);
    EXPECT_EQ(translator.asked, 0);
}

TEST(SafeCast, ToAMissingInterfaceAsksOnceHoldsNothingAndIsABadCast) {
    Probe probe;
    expectBadCast([&] { safeCast<Dial>(&probe); });
    EXPECT_EQ(probe.asked, 1);
    EXPECT_EQ(probe.references, 0);
}

TEST(QueryCast, AnswersNullWhereSafeCastThrows) {
    Probe probe;
    EXPECT_FALSE(queryCast<Dial>(&probe));
    EXPECT_EQ(probe.asked, 1);
    EXPECT_EQ(probe.references, 0);
    EXPECT_FALSE(queryCast<Gauge>(nullptr));
    EXPECT_FALSE(queryCast<Gauge>(static_cast<QrCastable*>(nullptr)));
    EXPECT_FALSE(queryCast<Gauge>(static_cast<const QrCastable*>(nullptr)));
}

TEST(QueryCast, HoldsOneReferenceWhereItSucceeds) {
    Probe probe;
    {
        const QrPtr<Gauge> gauge = queryCast<Gauge>(&probe);
        EXPECT_EQ(gauge.get(), &probe);
        EXPECT_EQ(probe.references, 1);
        EXPECT_EQ(probe.asked, 1);
    }
    EXPECT_EQ(probe.references, 0);
}

TEST(SafeCast, AsksTheObjectFirstAndThenItsTranslators) {
    Probe probe;
    PlainDial dial;
    const Translation translation(&probe, &dial, acceptsDial);
    Dial* const found = safeCast<Dial>(&probe);
    EXPECT_EQ(found, &dial);
    EXPECT_EQ(probe.asked, 1);
    EXPECT_EQ(dial.asked, 1);
    EXPECT_EQ(dial.references, 1) << "the reference of the result";
    EXPECT_EQ(probe.references, 0);
    found->release();
    EXPECT_EQ(queryCast<Dial>(&probe)->mark(), 5);
    EXPECT_EQ(dial.references, 0);
}

TEST(SafeCast, DoesNotAskTranslatorsForWhatTheObjectAnswers) {
    Probe probe;
    Probe translator;
    const Translation translation(&probe, &translator, acceptsEverything);
    const auto gauge = QrPtr<Gauge>::adopt(safeCast<Gauge>(&probe));
    EXPECT_EQ(gauge.get(), &probe);
    EXPECT_EQ(translator.asked, 0);
}

TEST(SafeCast, IsABadCastWhenTheTranslatorHasNoAnswerEither) {
    Probe probe;
    Probe translator;
    const Translation translation(&probe, &translator, acceptsEverything);
    expectBadCast([&] { safeCast<Dial>(&probe); });
    EXPECT_FALSE(queryCast<Dial>(&probe));
    EXPECT_EQ(translator.asked, 2);
    EXPECT_EQ(probe.references, 0);
    EXPECT_EQ(translator.references, 0);
}

TEST(SafeCast, FailureLeavesACountedObjectToItsOwner) {
    int alive = 0;
    const QrPtr<Counted> object(new Counted(alive));
    expectBadCast([&] { safeCast<Dial>(object.get()); });
    EXPECT_EQ(alive, 1);
    EXPECT_EQ(object->newReference(), 1);
    EXPECT_EQ(object->release(), 0);
}

// ---- The types that a cast accepts ----------------------------------------------------------

class InheritsItsUid : public Gauge {};
class InheritsItsSelf : public Gauge {
  public:
    [[maybe_unused]] static constexpr QrUid uid{0x3C5A0021, 0x51C24E0B, 0x8F3D6A70, 0x1B9E0C55};
};
class IsNoCastable {
  public:
    using Self = IsNoCastable;
    static constexpr QrUid uid{0x3C5A0022, 0x51C24E0B, 0x8F3D6A70, 0x1B9E0C55};
};
class HasAnotherUidType : public QrCastable {
  public:
    using Self = HasAnotherUidType;
    static constexpr int uid = 5;
};

static_assert(QrInterface<Gauge>);
static_assert(QrInterface<FineGauge>);
static_assert(!QrInterface<QrCastable>, "the root names no interface");
static_assert(!QrInterface<InheritsItsUid>);
static_assert(!QrInterface<InheritsItsSelf>);
static_assert(!QrInterface<IsNoCastable>);
static_assert(!QrInterface<HasAnotherUidType>);
static_assert(!QrInterface<Probe>, "an implementation is not the interface that it implements");
static_assert(!QrInterface<const Gauge>);

} // namespace
