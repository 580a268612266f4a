// SPDX-License-Identifier: BSL-1.0
// Tests the four reference classes: references taken and released by every operation, and
// assignments that destroy the old object.
#include "tests/unit/testObjects.h"

#include <gtest/gtest.h>

#include <functional>
#include <type_traits>

using namespace Mz;
using namespace Mz::Test;

namespace {

struct Ref {
    template <class T>
    using To = QrRef<T>;
    static constexpr const char* name = "QrRef";
};
struct Ptr {
    template <class T>
    using To = QrPtr<T>;
    static constexpr const char* name = "QrPtr";
};
struct CPtr {
    template <class T>
    using To = QrCPtr<T>;
    static constexpr const char* name = "QrCPtr";
};
struct RefPtr {
    template <class T>
    using To = QrRefPtr<T>;
    static constexpr const char* name = "QrRefPtr";
};
struct CRefPtr {
    template <class T>
    using To = QrCRefPtr<T>;
    static constexpr const char* name = "QrCRefPtr";
};

struct Names {
    template <class T>
    static std::string GetName(int) {
        return T::name;
    }
};

template <class Kind>
class Reference : public testing::Test {
  protected:
    using Probed = typename Kind::template To<Probe>;
    using AsGauge = typename Kind::template To<Gauge>;
    Probe probe;
    Probe other;
};

using Kinds = testing::Types<Ref, Ptr, CPtr, RefPtr, CRefPtr>;
TYPED_TEST_SUITE(Reference, Kinds, Names);

TYPED_TEST(Reference, IsOnePointerInSizeAndStartsNull) {
    using Probed = typename TestFixture::Probed;
    static_assert(sizeof(Probed) == sizeof(void*));
    const Probed empty;
    const Probed null(nullptr);
    const Probed nullObject(static_cast<Probe*>(nullptr));
    for (const Probed* reference : {&empty, &null, &nullObject}) {
        EXPECT_EQ(reference->get(), nullptr);
        EXPECT_FALSE(*reference);
        EXPECT_TRUE(*reference == nullptr);
    }
}

TYPED_TEST(Reference, TakesANewReferenceOnARawPointerAndGivesItBackAtItsEnd) {
    {
        const typename TestFixture::Probed reference(&this->probe);
        EXPECT_EQ(this->probe.references, 1);
        EXPECT_TRUE(static_cast<bool>(reference));
        EXPECT_EQ(reference.get(), &this->probe);
        EXPECT_EQ(reference->value(), 7);
        EXPECT_EQ(&*reference, &this->probe);
    }
    EXPECT_EQ(this->probe.references, 0);
}

TYPED_TEST(Reference, AdoptsAReferenceWithoutTakingAnother) {
    this->probe.newReference();
    {
        const auto reference = TestFixture::Probed::adopt(&this->probe);
        EXPECT_EQ(this->probe.references, 1);
        EXPECT_EQ(reference.get(), &this->probe);
    }
    EXPECT_EQ(this->probe.references, 0);
    EXPECT_FALSE(TestFixture::Probed::adopt(nullptr));
}

TYPED_TEST(Reference, CopiesTakeAndMovesDoNot) {
    using Probed = typename TestFixture::Probed;
    Probed first(&this->probe);
    const Probed copy(first);
    EXPECT_EQ(this->probe.references, 2);
    const Probed moved(std::move(first));
    EXPECT_EQ(this->probe.references, 2);
    EXPECT_EQ(first.get(), nullptr);
    EXPECT_EQ(moved.get(), &this->probe);
    EXPECT_EQ(copy.get(), &this->probe);
    static_assert(std::is_nothrow_move_constructible_v<Probed>);
}

TYPED_TEST(Reference, ConvertsToAReferenceToABase) {
    using Probed = typename TestFixture::Probed;
    using AsGauge = typename TestFixture::AsGauge;
    Probed derived(&this->probe);
    AsGauge copied(derived);
    EXPECT_EQ(this->probe.references, 2);
    AsGauge moved(std::move(derived));
    EXPECT_EQ(this->probe.references, 2);
    EXPECT_EQ(derived.get(), nullptr);
    AsGauge assigned;
    assigned = Probed(&this->probe);
    EXPECT_EQ(this->probe.references, 3);
    const Probed again(&this->probe);
    copied = again;
    EXPECT_EQ(this->probe.references, 4);
    EXPECT_EQ(copied->value(), 7);
    static_assert(!std::is_convertible_v<AsGauge, Probed>, "a base is no derived");
}

TYPED_TEST(Reference, AssignmentReplacesTheReference) {
    using Probed = typename TestFixture::Probed;
    Probed reference(&this->probe);
    reference = Probed(&this->other);
    EXPECT_EQ(this->probe.references, 0);
    EXPECT_EQ(this->other.references, 1);
    const Probed third(&this->probe);
    reference = third;
    EXPECT_EQ(this->probe.references, 2);
    EXPECT_EQ(this->other.references, 0);
    reference = &this->other;
    EXPECT_EQ(this->probe.references, 1);
    EXPECT_EQ(this->other.references, 1);
    reference = nullptr;
    EXPECT_EQ(this->other.references, 0);
    EXPECT_FALSE(reference);
}

TYPED_TEST(Reference, AssignmentToItselfChangesNothing) {
    using Probed = typename TestFixture::Probed;
    Probed reference(&this->probe);
    Probed& alias = reference;
    reference = alias;
    EXPECT_EQ(this->probe.references, 1);
    EXPECT_EQ(reference.get(), &this->probe);
    reference = std::move(alias);
    EXPECT_EQ(this->probe.references, 1);
    EXPECT_EQ(reference.get(), &this->probe);
    reference = reference.get() ? &this->probe : nullptr;
    EXPECT_EQ(this->probe.references, 1);
}

TYPED_TEST(Reference, ResetGivesBackAndDetachDoesNot) {
    using Probed = typename TestFixture::Probed;
    Probed reference(&this->probe);
    reference.reset();
    EXPECT_EQ(this->probe.references, 0);
    EXPECT_FALSE(reference);
    reference.reset();
    EXPECT_EQ(this->probe.references, 0);
    reference = &this->probe;
    auto* const detached = reference.detach();
    EXPECT_EQ(detached, &this->probe);
    EXPECT_FALSE(reference);
    EXPECT_EQ(this->probe.references, 1);
    EXPECT_TRUE(Probed::adopt(detached));
    EXPECT_EQ(this->probe.references, 0);
    EXPECT_EQ(reference.detach(), nullptr);
}

TYPED_TEST(Reference, SwapsWithoutCounting) {
    using Probed = typename TestFixture::Probed;
    Probed a(&this->probe);
    Probed b(&this->other);
    a.swap(b);
    EXPECT_EQ(a.get(), &this->other);
    EXPECT_EQ(b.get(), &this->probe);
    swap(a, b);
    EXPECT_EQ(a.get(), &this->probe);
    a.swap(a);
    EXPECT_EQ(a.get(), &this->probe);
    EXPECT_EQ(this->probe.references, 1);
    EXPECT_EQ(this->other.references, 1);
}

TYPED_TEST(Reference, EqualsWhatLooksAtTheSameObject) {
    using Probed = typename TestFixture::Probed;
    using AsGauge = typename TestFixture::AsGauge;
    const Probed a(&this->probe);
    const Probed b(&this->probe);
    const AsGauge base(&this->probe);
    EXPECT_TRUE(a == b);
    EXPECT_TRUE(a == base);
    EXPECT_TRUE(base == a);
    EXPECT_TRUE(a == &this->probe);
    EXPECT_TRUE(&this->probe == a);
    EXPECT_TRUE(a != nullptr);
    EXPECT_TRUE(a != Probed(&this->other));
    EXPECT_TRUE(Probed() == Probed());
    EXPECT_TRUE(nullptr == Probed());
}

TEST(ConstReference, GivesConstAccessOnlyAndComesFromTheOthers) {
    static_assert(std::is_same_v<decltype(std::declval<QrCPtr<Probe>&>().get()), const Probe*>);
    static_assert(std::is_same_v<decltype(*std::declval<QrCRefPtr<Probe>&>()), const Probe&>);
    static_assert(std::is_convertible_v<QrPtr<Probe>, QrCPtr<Probe>>);
    static_assert(std::is_convertible_v<QrRef<Probe>, QrCRefPtr<Gauge>>);
    static_assert(!std::is_convertible_v<QrCPtr<Probe>, QrPtr<Probe>>);
    static_assert(!std::is_convertible_v<QrCRefPtr<Probe>, QrRefPtr<Probe>>);
    Probe probe;
    const QrPtr<Probe> plain(&probe);
    const QrCPtr<Gauge> constant = plain;
    EXPECT_EQ(probe.references, 2);
    EXPECT_TRUE(constant == plain);
}

/// Owns the next object of a chain.
class Chained : public QrCastRef<QrCastHeap<QrCastImpl<Chained, Gauge>>> {
  public:
    explicit Chained(int& alive) : alive(alive) { ++alive; }
    ~Chained() override {
        --alive;
        if (atEnd)
            atEnd();
    }
    int value() const override { return alive; }

    QrPtr<Chained> next;
    std::function<void()> atEnd;

  private:
    int& alive;
};

TEST(ReferenceAssignment, FromWhatTheOldObjectAloneKeepsAliveIsSafe) {
    int alive = 0;
    {
        QrPtr<Chained> head(new Chained(alive));
        head->next = new Chained(alive);
        head->next->next = new Chained(alive);
        head = head->next;
        EXPECT_EQ(alive, 2);
        head = std::move(head->next);
        EXPECT_EQ(alive, 1);
        EXPECT_EQ(head->value(), 1);
        head->next = new Chained(alive);
        head = head->next.get();
        EXPECT_EQ(alive, 1);
    }
    EXPECT_EQ(alive, 0);
}

TEST(ReferenceReset, IsNullAlreadyWhenTheObjectDies) {
    int alive = 0;
    QrPtr<Chained> reference(new Chained(alive));
    bool seen = false;
    reference->atEnd = [&] {
        seen = true;
        EXPECT_EQ(reference.get(), nullptr);
        reference.reset();
    };
    reference.reset();
    EXPECT_TRUE(seen);
    EXPECT_EQ(alive, 0);
}

TEST(ReferenceReset, MayFindTheReferenceSetAnewFromWithinTheDestructor) {
    int alive = 0;
    QrPtr<Chained> reference(new Chained(alive));
    reference->atEnd = [&] { reference = new Chained(alive); };
    reference.reset();
    EXPECT_EQ(alive, 1);
    ASSERT_TRUE(reference);
    reference = nullptr;
    EXPECT_EQ(alive, 0);
}

TEST(ReferenceAssignment, ShowsTheNewObjectToTheOldOnesDestructor) {
    int alive = 0;
    QrPtr<Chained> reference(new Chained(alive));
    const QrPtr<Chained> next(new Chained(alive));
    bool seen = false;
    reference->atEnd = [&] { seen = reference == next; };
    reference = next;
    EXPECT_TRUE(seen);
}

TEST(ReferenceArguments, ByValueCostOneReferenceThatEndsWithTheCall) {
    Probe probe;
    const auto callee = [&](QrPtr<Gauge> gauge) {
        EXPECT_EQ(probe.references, 1);
        EXPECT_EQ(gauge->value(), 7);
    };
    callee(&probe);
    EXPECT_EQ(probe.references, 0);
}

} // namespace
