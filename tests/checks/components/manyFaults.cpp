// SPDX-License-Identifier: BSL-1.0
/// Has a builder for each of several faults that do not hide one another.
#include "tests/checks/components/broken.h"
#include "tests/checks/components/oneThread.h"

#include "components/componentManager/exceptions.h"

#include <stdexcept>

using namespace Mz;
using Test::testUid;

namespace {

constexpr QrUid viewUid = testUid(0x5E11), miscountsUid = testUid(0x5E12),
                uncountedUid = testUid(0x5E13), classlessUid = testUid(0x5E14),
                throwsClassUid = testUid(0x5E15), unreadableUid = testUid(0x5E16),
                threadsUid = testUid(0x5E17);

/// Has a view for one interface, and the view knows none.
class Viewed final : public QrCastRef<QrCastHeap<QrCastImpl<Viewed, Test::PlainObject>>> {
  public:
    const char* maker() const override { return "viewed"; }
    QrCastable* getInterface(const QrUid& wanted) override {
        if (!(wanted == QrPersistant::uid))
            return QrCastRef::getInterface(wanted);
        newReference();
        return &view;
    }
    bool hasInterface(const QrUid& wanted) const override {
        return wanted == QrPersistant::uid || QrCastRef::hasInterface(wanted);
    }

  private:
    class View final : public QrPersistant {
      public:
        explicit View(Viewed& viewed) : owner(viewed) {}
        const QrCastable* getCastable() const override { return owner.getCastable(); }
        QrCastable* getCastable() override { return owner.getCastable(); }
        QrCastable* getInterface(const QrUid&) override { return nullptr; }
        bool hasInterface(const QrUid&) const override { return false; }
        void destroy() override {}
        long newReference() override { return owner.newReference(); }
        long release() override { return owner.release(); }
        const QrUid* getClassUid() const override { return &viewUid; }
        unsigned int getVersion() const override { return 1; }
        void write(QrStream&) override {}
        void read(QrStream&) override {}

      private:
        Viewed& owner;
    };

    View view{*this};
};

/// Its release always returns 0.
class Miscounting final : public QrCastRef<QrCastHeap<QrCastImpl<Miscounting, Test::PlainObject>>> {
  public:
    const char* maker() const override { return "miscounting"; }
    long release() override {
        QrCastRef::release();
        return 0;
    }
};

/// Is not counted, so that nothing deletes it.
class Uncounted final : public QrCastImpl<Uncounted, Test::PlainObject> {
  public:
    const char* maker() const override { return "uncounted"; }
};

class MakesUncounted final : public Kit::Builder<MakesUncounted> {
  public:
    MakesUncounted() : Builder({.uid = uncountedUid, .name = L"uncounted", .label = L"Leaks"}) {}
    QrRef<QrCastable> createObject() override { return (new Uncounted)->getCastable(); }
};

class Classless final : public Test::Stored {
  public:
    const QrUid* getClassUid() const override { return nullptr; }
};

class ThrowsClass final : public Test::Stored {
  public:
    const QrUid* getClassUid() const override { throw std::runtime_error("no class today"); }
};

class Unreadable final : public Test::Stored {
  public:
    const QrUid* getClassUid() const override { return &unreadableUid; }
    void read(QrStream& stream) override {
        stream >> number;
        throw QrStreamEx::ExReadError("manyFaults", __LINE__, "the number is too old");
    }
};

/// Throws when several threads use it.
class ForOneThread final : public Kit::Builder<ForOneThread> {
  public:
    ForOneThread() : Builder({.uid = threadsUid, .name = L"oneThread", .label = L"One thread"}) {}
    QrRef<QrCastable> createObject() override {
        if (!oneThread.isAlone())
            throw std::runtime_error("another thread is here");
        return (new Test::NamedObject(""))->getCastable();
    }

  private:
    Test::OneThread oneThread;
};

} // namespace

MZ_COMPONENT(
    L"Many faults", L"Breaks many rules",
    Kit::builderOf<Viewed>({.uid = viewUid, .name = L"viewed", .label = L"Viewed"}),
    Kit::builderOf<Miscounting>(
        {.uid = miscountsUid, .name = L"miscounting", .label = L"Miscounts"}),
    Kit::builder<MakesUncounted>(),
    Kit::builderOf<Classless>({.uid = classlessUid, .name = L"classless", .label = L"No class"}),
    Kit::builderOf<ThrowsClass>(
        {.uid = throwsClassUid, .name = L"throwsClass", .label = L"Throws"}),
    Kit::builderOf<Unreadable>(
        {.uid = unreadableUid, .name = L"unreadable", .label = L"Unreadable"}),
    Kit::builder<ForOneThread>())
