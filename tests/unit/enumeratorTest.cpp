// SPDX-License-Identifier: BSL-1.0
// Tests the enumerator interface, and the protocol in which the manager calls it.
#include "components/componentManager/enumerator.h"
#include "components/componentManager/manager/componentImpPrivate.h"

#include <gtest/gtest.h>

#include <climits>
#include <initializer_list>
#include <type_traits>
#include <vector>

using namespace Mz;

namespace {

static_assert(QrEnum::Continue == 0 && QrEnum::Stop == 1 && QrEnum::Fail == 2);
static_assert(std::is_same_v<std::underlying_type_t<QrEnum::Action>, int>);
static_assert(sizeof(QrEnum::Action) == 4);
static_assert(std::is_base_of_v<QrEnum, QrEnumerator<const wchar_t*>>);
static_assert(std::has_virtual_destructor_v<QrEnumerator<const wchar_t*>>);
static_assert(std::is_abstract_v<QrEnumerator<const wchar_t*>>);

class Numbers : public QrEnumerator<int> {
  public:
    Action process(int element) override {
        seen.push_back(element);
        return element == stopAt ? verdict : Continue;
    }
    int stopAt = -1;
    Action verdict = Stop;
    std::vector<int> seen;
};

QrEnum::Action enumerate(std::initializer_list<int> elements, QrEnumerator<int>& e) {
    for (const int element : elements)
        if (const QrEnum::Action action = e.process(element))
            return action;
    return e.finished();
}

TEST(Enumerator, FinishesWithContinueUnlessOverridden) {
    Numbers numbers;
    EXPECT_EQ(numbers.finished(), QrEnum::Continue);
    EXPECT_EQ(enumerate({}, numbers), QrEnum::Continue);
    EXPECT_EQ(enumerate({1, 2}, numbers), QrEnum::Continue);
}

TEST(Enumerator, MayServeTwoSequencesWithOneSetOfVerdicts) {
    struct Both : QrEnumerator<int>, QrEnumerator<const wchar_t*> {
        Action process(int) override { return Stop; }
        Action process(const wchar_t*) override { return Fail; }
        Action finished() override { return Continue; }
    };
    Both both;
    EXPECT_EQ(static_cast<QrEnumerator<int>&>(both).process(1), QrEnum::Stop);
    EXPECT_EQ(static_cast<QrEnumerator<const wchar_t*>&>(both).process(L""), QrEnum::Fail);
    static_assert(std::is_convertible_v<Both*, QrEnum*>, "one QrEnum, not two");
}

// ---- The protocol, tested with the manager's enumeration ------------------------------------

class Descriptions : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> item) override {
        seen.emplace_back(item->getName());
        return seen.size() == stopAfter ? verdict : Continue;
    }
    Action finished() override {
        ++finishes;
        return end;
    }
    std::size_t stopAfter = 0;
    Action verdict = Stop;
    Action end = Continue;
    int finishes = 0;
    std::vector<std::wstring> seen;
};

class ManagerEnumeration : public testing::Test {
  protected:
    void fill() {
        for (int library = 0; library < 2; ++library) {
            ComponentLibrary& added = manager.libraries.emplace_back(manager);
            for (int builder = 0; builder < 2; ++builder) {
                ComponentManager::Builder& record = added.builders.emplace_back();
                record.library = &added;
                record.name = std::to_wstring(library) + std::to_wstring(builder);
            }
        }
        manager.initialised = true;
    }
    ComponentManager manager;
    Descriptions enumerator;
};

TEST_F(ManagerEnumeration, OfNothingOnlyFinishes) {
    enumerator.end = QrEnum::Fail;
    EXPECT_EQ(manager.enumerateBuilders(enumerator), QrEnum::Fail);
    EXPECT_EQ(enumerator.finishes, 1);
    EXPECT_TRUE(enumerator.seen.empty());
    manager.initialised = true;
    EXPECT_EQ(manager.enumerateBuilders(enumerator), QrEnum::Fail);
    EXPECT_EQ(enumerator.finishes, 2);
    EXPECT_TRUE(enumerator.seen.empty());
}

TEST_F(ManagerEnumeration, BeforeInitialisationOffersNothingThatIsRecorded) {
    fill();
    manager.initialised = false;
    EXPECT_EQ(manager.enumerateBuilders(enumerator), QrEnum::Continue);
    EXPECT_EQ(enumerator.finishes, 1);
    EXPECT_TRUE(enumerator.seen.empty());
}

TEST_F(ManagerEnumeration, OffersEveryElementInOrderAndFinishesOnce) {
    fill();
    EXPECT_EQ(manager.enumerateBuilders(enumerator), QrEnum::Continue);
    EXPECT_EQ(enumerator.seen, (std::vector<std::wstring>{L"00", L"01", L"10", L"11"}));
    EXPECT_EQ(enumerator.finishes, 1);
}

TEST_F(ManagerEnumeration, FailOnTheFirstElementEndsItWithoutFinishing) {
    fill();
    enumerator.stopAfter = 1;
    enumerator.verdict = QrEnum::Fail;
    EXPECT_EQ(manager.enumerateBuilders(enumerator), QrEnum::Fail);
    EXPECT_EQ(enumerator.seen.size(), 1u);
    EXPECT_EQ(enumerator.finishes, 0);
}

TEST_F(ManagerEnumeration, StopOnTheLastElementDoesNotFinish) {
    fill();
    enumerator.stopAfter = 4;
    EXPECT_EQ(manager.enumerateBuilders(enumerator), QrEnum::Stop);
    EXPECT_EQ(enumerator.finishes, 0);
}

TEST_F(ManagerEnumeration, ReturnsAnyValueThatIsNotZeroUnchanged) {
    fill();
    for (const int value : {3, 7, 256, 65536, 0x7FFFFFFF, -1, INT_MIN}) {
        Descriptions callback;
        callback.stopAfter = 3;
        callback.verdict = static_cast<QrEnum::Action>(value);
        EXPECT_EQ(static_cast<int>(manager.enumerateBuilders(callback)), value);
        EXPECT_EQ(callback.seen.size(), 3u);
        EXPECT_EQ(callback.finishes, 0);
        Descriptions finisher;
        finisher.end = static_cast<QrEnum::Action>(value);
        EXPECT_EQ(static_cast<int>(manager.enumerateBuilders(finisher)), value);
    }
}

TEST_F(ManagerEnumeration, LetsExceptionsThrough) {
    fill();
    class Thrower : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
      public:
        Action process(QrCPtr<QrBuilderDescription>) override { throw 5; }
    } thrower;
    EXPECT_THROW(manager.enumerateBuilders(thrower), int);
}

} // namespace
