// SPDX-License-Identifier: BSL-1.0
// Persistent classes without faults.
#include "components/componentKit/componentKit.h"
#include "components/objectIO/objectIO.h"
#include "tests/objects/components/classes.h"
#include "tests/support/journal.h"

namespace {

using namespace Mz;
using namespace Mz::Test;

int nodesAlive = 0;

/// Resolves its links in `loadFinished`. Until then only the reader owns the nodes, so that a
/// failed load leaves no cycle of references.
class NodeObject final : public QrCastRef<QrCastHeap<QrCastMulti<NodeObject, Node, QrPersistant>>> {
  public:
    NodeObject() { ++nodesAlive; }
    NodeObject(const NodeObject&) = delete;
    NodeObject& operator=(const NodeObject&) = delete;
    ~NodeObject() override { --nodesAlive; }

    const QrUid* getClassUid() const override { return &nodeUid; }
    unsigned int getVersion() const override { return 3; }

    void write(QrStream& stream) override {
        stream << number;
        QrWriteExactText(stream, name);
        stream << flag << weight << static_cast<unsigned int>(links.size());
        for (const QrPtr<Node>& link : links)
            stream << link.get();
    }

    void read(QrStream& stream) override {
        stream >> number;
        name = QrReadExactText(stream);
        unsigned int count = 0;
        stream >> flag >> weight >> count;
        for (; count > 0; --count) {
            const QrRef<QrCastable> link = stream.readObject(&Node::uid, nullptr, nullptr);
            pending.push_back(link ? QrPtr<Node>::adopt(safeCast<Node>(link.get())).get()
                                   : nullptr);
        }
        stream.postLoad(this);
    }

    void loadFinished() override {
        for (Node* link : pending)
            links.emplace_back(link);
        pending.clear();
        note(std::to_string(number).c_str());
    }

  private:
    std::vector<Node*> pending;
};

/// Does not own a holder that is still being read: a failed load would leave a cycle of references.
class HolderObject final
    : public QrCastRef<QrCastHeap<QrCastMulti<HolderObject, Node, QrPersistant>>> {
  public:
    HolderObject() { ++nodesAlive; }
    HolderObject(const HolderObject&) = delete;
    HolderObject& operator=(const HolderObject&) = delete;
    ~HolderObject() override { --nodesAlive; }

    const QrUid* getClassUid() const override { return &holderUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override {
        stream << number << static_cast<unsigned int>(links.size());
        for (const QrPtr<Node>& link : links)
            stream << link.get();
    }
    void read(QrStream& stream) override {
        unsigned int count = 0;
        stream >> number >> count;
        for (; count > 0; --count) {
            QrPtr<Node> link =
                queryCast<Node>(stream.readObject(&Node::uid, nullptr, nullptr).get());
            const auto* holder = dynamic_cast<const HolderObject*>(link.get());
            if (!holder || holder->whole)
                links.push_back(std::move(link));
        }
        whole = true;
    }

  private:
    bool whole = false;
};

class CensusObject final : public QrCastRef<QrCastHeap<QrCastImpl<CensusObject, Census>>> {
  public:
    int alive() const override { return nodesAlive; }
};

class StringObject final
    : public QrCastRef<QrCastHeap<QrCastMulti<StringObject, Node, QrPersistant>>> {
  public:
    const QrUid* getClassUid() const override { return &stringUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override { stream << number << name << number; }
    void read(QrStream& stream) override { stream >> number >> name >> number; }
};

/// Stores an array of two characters. Only binary streams can carry it.
class WideObject final : public QrCastRef<QrCastHeap<QrCastMulti<WideObject, Node, QrPersistant>>> {
  public:
    const QrUid* getClassUid() const override { return &wideUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override { stream.write(name[0], 2); }
    void read(QrStream& stream) override {
        name.resize(2);
        if (stream.read(name[0], 2) != 2)
            throw QrStreamEx::ExReadError("tests/objects/wideObject", __LINE__);
    }
};

class CompanionObject;

class Companion final
    : public QrTempObject<CompanionObject,
                          QrCastRef<QrCastHeap<QrCastImpl<Companion, QrPersistant>>>> {
  public:
    explicit Companion(CompanionObject* owner) : QrTempObject(owner) {}
    const QrUid* getClassUid() const override { return &companionUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream& stream) override;
    void read(QrStream& stream) override;
};

/// Does not define `destroy`: its companion's `destroy` would delete it while it is still
/// referenced.
class CompanionObject final
    : public QrCastRef<
          QrCastImpl2<CompanionObject, Node, QrTempIface<CompanionObject, Companion>>> {};

void Companion::write(QrStream& stream) {
    stream << owner()->number << owner();
}

void Companion::read(QrStream& stream) {
    stream >> owner()->number;
    // The object that was written is the owner, which the stream already knows.
    const QrRef<QrCastable> same = stream.readObject(nullptr, nullptr, nullptr);
    owner()->flag = same == owner();
    stream.postLoad(this);
}

} // namespace

MZ_COMPONENT(L"Classes", L"", Kit::builderOf<CensusObject>({.uid = censusUid}),
             Kit::builderOf<NodeObject>({.uid = nodeUid}),
             Kit::builderOf<NodeObject>({.uid = otherClassUid}),
             Kit::builderOf<HolderObject>({.uid = holderUid}),
             Kit::builderOf<StringObject>({.uid = stringUid}),
             Kit::builderOf<WideObject>({.uid = wideUid}),
             Kit::builderOf<CompanionObject>({.uid = companionUid}))
