// SPDX-License-Identifier: BSL-1.0
// Tests the registry of translators: order, removal, changes during a lookup, exceptions, and
// use before main and after it.
#include "tests/unit/testObjects.h"

#include <gtest/gtest.h>

#include <memory>
#include <vector>

using namespace Mz;
using namespace Mz::Test;

namespace {

int dialQuestions = 0;

bool acceptsDial(const QrUid& uid) {
    ++dialQuestions;
    return uid == Dial::uid;
}
bool acceptsEverything(const QrUid&) {
    return true;
}
bool acceptsNothing(const QrUid&) {
    return false;
}

/// Supplies `Dial` if `answers` is true.
class Translator : public QrCastImpl<Translator, Dial> {
  public:
    explicit Translator(bool answers = true) : answers(answers) {}
    int mark() const override { return 1; }
    QrCastable* getInterface(const QrUid& uid) override {
        ++asked;
        return answers ? QrCastImpl<Translator, Dial>::getInterface(uid) : nullptr;
    }
    long newReference() override { return ++references; }
    long release() override { return --references; }

    bool answers;
    int asked = 0;
    long references = 0;
};

class TranslationRegistry : public testing::Test {
  protected:
    ~TranslationRegistry() override {
        for (QrCastable* translator : {&a, &b, &c})
            for (int repeated = 0; repeated < 8; ++repeated)
                QrRemoveTranslation(&object, translator);
    }

    void add(Translator& translator) { QrAddTranslation(&object, &translator, acceptsEverything); }
    void remove(Translator& translator) { QrRemoveTranslation(&object, &translator); }

    /// Returns the translators of the object in order. Each lookup lets one more translator
    /// decline.
    std::string order() {
        std::string names;
        for (int position = 0; position < 10; ++position) {
            seen = 0;
            stopAt = position;
            QrCastable* const found = QrTranslateInterface(&object, probeUid);
            if (seen <= position)
                break;
            names += found == &a ? 'A' : found == &b ? 'B' : 'C';
        }
        return names;
    }
    void addProbed(Translator& translator) { QrAddTranslation(&object, &translator, countDown); }

    static bool countDown(const QrUid&) { return seen++ == stopAt; }

    static constexpr QrUid probeUid = Dial::uid;
    static inline int seen = 0;
    static inline int stopAt = 0;

    Probe object;
    Translator a;
    Translator b;
    Translator c;
};

TEST_F(TranslationRegistry, KnowsNothingOfAnObjectNeverAdded) {
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), nullptr);
    remove(a);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), nullptr);
    EXPECT_EQ(object.asked, 0);
    EXPECT_EQ(QrTranslateInterface(nullptr, Dial::uid), nullptr);
    QrRemoveTranslation(nullptr, &a);
    QrRemoveTranslation(nullptr, nullptr);
}

TEST_F(TranslationRegistry, GivesTheTranslatorsAnswerWithItsOneReference) {
    QrAddTranslation(&object, &a, acceptsDial);
    QrCastable* const found = QrTranslateInterface(&object, Dial::uid);
    EXPECT_EQ(found, &a);
    EXPECT_EQ(a.references, 1);
    EXPECT_EQ(object.asked, 0) << "the registry must not call the object";
}

TEST_F(TranslationRegistry, TakesNoReferencesOfItsOwn) {
    add(a);
    EXPECT_EQ(a.references, 0);
    EXPECT_EQ(object.references, 0);
    remove(a);
    EXPECT_EQ(a.references, 0);
    EXPECT_EQ(object.references, 0);
}

TEST_F(TranslationRegistry, PassesOverTranslatorsThatDoNotAccept) {
    QrAddTranslation(&object, &a, acceptsNothing);
    QrAddTranslation(&object, &b, acceptsDial);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), &b);
    EXPECT_EQ(a.asked, 0);
    EXPECT_EQ(QrTranslateInterface(&object, unknownUid), nullptr);
    EXPECT_EQ(b.asked, 1);
}

TEST_F(TranslationRegistry, TheFirstThatAcceptsDecidesEvenWithNull) {
    a.answers = false;
    add(a);
    dialQuestions = 0;
    QrAddTranslation(&object, &b, acceptsDial);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), nullptr);
    EXPECT_EQ(a.asked, 1);
    EXPECT_EQ(b.asked, 0);
    EXPECT_EQ(dialQuestions, 0);
}

TEST_F(TranslationRegistry, KeepsObjectsApart) {
    Probe second;
    add(a);
    QrAddTranslation(&second, &b, acceptsEverything);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), &a);
    EXPECT_EQ(QrTranslateInterface(&second, Dial::uid), &b);
    QrRemoveTranslation(&second, &a);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), &a);
    QrRemoveTranslation(&second, &b);
    EXPECT_EQ(QrTranslateInterface(&second, Dial::uid), nullptr);
}

TEST_F(TranslationRegistry, ShowsItsOrderToTheTests) {
    EXPECT_EQ(order(), "");
    addProbed(a);
    addProbed(b);
    addProbed(c);
    EXPECT_EQ(order(), "ABC");
}

TEST_F(TranslationRegistry, RemovalOfAFromAABLeavesABAndThenB) {
    addProbed(a);
    addProbed(a);
    addProbed(b);
    remove(a);
    EXPECT_EQ(order(), "AB");
    remove(a);
    EXPECT_EQ(order(), "B");
    remove(a);
    EXPECT_EQ(order(), "B");
}

TEST_F(TranslationRegistry, OneRemovalTakesEverySecondOfARun) {
    for (int count = 0; count < 5; ++count)
        addProbed(a);
    remove(a);
    EXPECT_EQ(order(), "AA");
    remove(a);
    EXPECT_EQ(order(), "A");
    remove(a);
    EXPECT_EQ(order(), "");
}

TEST_F(TranslationRegistry, OneRemovalTakesAllThatAreApart) {
    for (Translator* translator : {&a, &b, &a, &c, &a})
        addProbed(*translator);
    remove(a);
    EXPECT_EQ(order(), "BC");
}

TEST_F(TranslationRegistry, RemovalKeepsTheOrderOfTheOthers) {
    for (Translator* translator : {&c, &a, &b, &c})
        addProbed(*translator);
    remove(a);
    EXPECT_EQ(order(), "CBC");
}

TEST_F(TranslationRegistry, RemovalOfTheLastEntryEndsThere) {
    addProbed(b);
    addProbed(a);
    remove(a);
    EXPECT_EQ(order(), "B");
    remove(b);
    EXPECT_EQ(order(), "");
    remove(b);
    EXPECT_EQ(order(), "");
    addProbed(c);
    EXPECT_EQ(order(), "C") << "an emptied sequence must be reusable";
}

TEST_F(TranslationRegistry, NullArgumentsAddNothing) {
    QrAddTranslation(&object, nullptr, acceptsEverything);
    QrAddTranslation(&object, &a, nullptr);
    QrAddTranslation(nullptr, &a, acceptsEverything);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), nullptr);
    EXPECT_EQ(QrTranslateInterface(nullptr, Dial::uid), nullptr);
}

TEST_F(TranslationRegistry, HoldsManyObjects) {
    constexpr std::size_t count = 1000;
    const auto objects = std::make_unique<Probe[]>(count);
    const auto translators = std::make_unique<Translator[]>(count);
    for (std::size_t index = 0; index < count; ++index)
        QrAddTranslation(&objects[index], &translators[index], acceptsEverything);
    for (std::size_t index = 0; index < count; ++index)
        EXPECT_EQ(QrTranslateInterface(&objects[index], Dial::uid), &translators[index]);
    for (std::size_t index = 0; index < count; ++index)
        QrRemoveTranslation(&objects[index], &translators[index]);
    for (std::size_t index = 0; index < count; ++index)
        EXPECT_EQ(QrTranslateInterface(&objects[index], Dial::uid), nullptr);
}

// ---- Changes during a lookup ----------------------------------------------------------------

QrCastable* changedObject = nullptr;
QrCastable* addedTranslator = nullptr;

bool addsAndDeclines(const QrUid&) {
    for (int count = 0; count < 100; ++count)
        QrAddTranslation(changedObject, addedTranslator, acceptsNothing);
    QrAddTranslation(changedObject, addedTranslator, acceptsEverything);
    return false;
}

TEST_F(TranslationRegistry, MayGrowWhileItIsAsked) {
    changedObject = &object;
    addedTranslator = &b;
    QrAddTranslation(&object, &a, addsAndDeclines);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), &b);
    for (int count = 0; count < 10; ++count)
        remove(b);
}

bool removesItselfAndAccepts(const QrUid&) {
    QrRemoveTranslation(changedObject, addedTranslator);
    return true;
}

bool removesItselfAndDeclines(const QrUid&) {
    QrRemoveTranslation(changedObject, addedTranslator);
    return false;
}

TEST_F(TranslationRegistry, StillAsksATranslatorThatItsPredicateRemoved) {
    changedObject = &object;
    addedTranslator = &a;
    QrAddTranslation(&object, &a, removesItselfAndAccepts);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), &a);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), nullptr);
}

TEST_F(TranslationRegistry, SurvivesAPredicateThatEmptiesTheSequence) {
    changedObject = &object;
    addedTranslator = &a;
    QrAddTranslation(&object, &a, removesItselfAndDeclines);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), nullptr);
}

/// Uses the registry for other objects while the registry calls it.
class Forwarder : public QrCastImpl<Forwarder, Dial> {
  public:
    explicit Forwarder(QrCastable* next) : next(next) {}
    int mark() const override { return 2; }
    QrCastable* getInterface(const QrUid& uid) override {
        Probe many[50];
        for (Probe& probe : many)
            QrAddTranslation(&probe, this, acceptsNothing);
        for (Probe& probe : many)
            QrRemoveTranslation(&probe, this);
        return QrTranslateInterface(next, uid);
    }

  private:
    QrCastable* next;
};

TEST_F(TranslationRegistry, MayBeAskedAndGrowFromWithinATranslator) {
    Probe outer;
    Forwarder forwarder(&object);
    add(a);
    QrAddTranslation(&outer, &forwarder, acceptsEverything);
    EXPECT_EQ(queryCast<Dial>(&outer)->mark(), 1);
    QrRemoveTranslation(&outer, &forwarder);
}

bool throwsInt(const QrUid&) {
    throw 42;
}

TEST_F(TranslationRegistry, LetsExceptionsOfPredicatesThrough) {
    QrAddTranslation(&object, &a, throwsInt);
    EXPECT_THROW(QrTranslateInterface(&object, Dial::uid), int);
    EXPECT_THROW(queryCast<Dial>(&object), int);
    remove(a);
    EXPECT_EQ(QrTranslateInterface(&object, Dial::uid), nullptr);
}

// ---- Before main and after it ---------------------------------------------------------------

Translator staticTranslator;
Probe staticObject;

/// Uses the registry in its constructor and its destructor, which run before and after main.
struct EarlyAndLate {
    EarlyAndLate() {
        QrAddTranslation(&staticObject, &staticTranslator, acceptsEverything);
        foundEarly = QrTranslateInterface(&staticObject, Dial::uid) == &staticTranslator;
    }
    ~EarlyAndLate() {
        if (QrTranslateInterface(&staticObject, Dial::uid) != &staticTranslator)
            std::abort();
        QrRemoveTranslation(&staticObject, &staticTranslator);
    }
    bool foundEarly = false;
};

EarlyAndLate earlyAndLate;

TEST(TranslationRegistryLifetime, SpansStaticConstructionAndDestruction) {
    EXPECT_TRUE(earlyAndLate.foundEarly);
    EXPECT_EQ(QrTranslateInterface(&staticObject, Dial::uid), &staticTranslator);
}

} // namespace
