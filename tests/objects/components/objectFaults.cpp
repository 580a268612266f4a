// SPDX-License-Identifier: BSL-1.0
// Persistent classes and builders with one fault or unusual behaviour each.
#include "components/componentKit/componentKit.h"
#include "components/objectIO/objectIO.h"
#include "tests/objects/components/classes.h"
#include "tests/support/journal.h"

#include <stdexcept>

namespace {

using namespace Mz;
using namespace Mz::Test;

template <class Impl>
using Counted = QrCastRef<QrCastHeap<QrCastMulti<Impl, Node, QrPersistant>>>;

class Viewed final : public Counted<Viewed> {
  public:
    const QrUid* getClassUid() const override { return &viewedUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override { stream << number; }
    void read(QrStream& stream) override { stream >> number; }
};

class ViewedBuilder final : public Kit::Builder<ViewedBuilder> {
  public:
    ViewedBuilder() : Builder({.uid = viewedUid}) {}
    QrRef<QrCastable> createObject() override {
        return QrRef<QrCastable>(static_cast<QrPersistant*>(new Viewed));
    }
};

class Selfish final : public Counted<Selfish> {
  public:
    Selfish() { note("made"); }
    ~Selfish() override { note("deleted"); }
    const QrUid* getClassUid() const override { return &selfishUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override { stream << number; }
    void read(QrStream& stream) override {
        // Each of these lines takes and releases a reference.
        { const QrPtr<Node> self(this); }
        stream.postLoad(this);
        stream.postLoad(nullptr);
        stream >> number;
        stream.postLoad(this);
    }
    void loadFinished() override { note("told"); }
};

class Careless final : public Counted<Careless> {
  public:
    const QrUid* getClassUid() const override { return &carelessUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override {
        for (const QrPtr<Node>& link : links)
            attempt([&] { stream << link.get(); });
    }
    void read(QrStream& stream) override {
        attempt([&] { stream.readObject(nullptr, nullptr, nullptr); });
    }

  private:
    template <class Work>
    static void attempt(Work&& work) {
        try {
            work();
        } catch (const std::exception&) {
            note("swallowed");
        }
    }
};

class Misleading final : public Counted<Misleading> {
  public:
    const QrUid* getClassUid() const override { return &misleadingUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream&) override {}
    void read(QrStream& stream) override {
        try {
            stream.readObject(nullptr, nullptr, nullptr);
        } catch (const QrStreamEx::ExReadObject&) {
            throw QrStreamEx::ExReadObject("misleading", 1);
        }
    }
};

class Miscast final : public Counted<Miscast> {
  public:
    const QrUid* getClassUid() const override { return &miscastUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream&) override {}
    void read(QrStream&) override { safeCast<Node>(nullptr); }
};

class NotPersistent final : public QrCastRef<QrCastHeap<QrCastImpl<NotPersistent, Node>>> {};

class MakesNull final : public Kit::Builder<MakesNull> {
  public:
    MakesNull() : Builder({.uid = makesNullUid}) {}
    QrRef<QrCastable> createObject() override { return nullptr; }
};

class Throwing final : public Kit::Builder<Throwing> {
  public:
    Throwing() : Builder({.uid = throwingUid}) {}
    QrRef<QrCastable> createObject() override { throw std::runtime_error("the builder's own"); }
};

} // namespace

MZ_COMPONENT(L"Faults", L"", Kit::builder<ViewedBuilder>(),
             Kit::builderOf<Selfish>({.uid = selfishUid}),
             Kit::builderOf<Careless>({.uid = carelessUid}),
             Kit::builderOf<Misleading>({.uid = misleadingUid}),
             Kit::builderOf<Miscast>({.uid = miscastUid}),
             Kit::builderOf<NotPersistent>({.uid = notPersistentUid}), Kit::builder<MakesNull>(),
             Kit::builder<Throwing>())
