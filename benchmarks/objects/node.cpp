// SPDX-License-Identifier: BSL-1.0
/// The component library of the nodes that the benchmarks save and load. It is written as a user
/// writes one: with the component kit, each value by one operator.
#include "node.h"

#include "components/componentKit/componentKit.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/stream.h"

namespace Mz::Benchmarks {

namespace {

class StoredNode final : public QrCastRef<QrCastHeap<QrCastMulti<StoredNode, Node, QrPersistant>>> {
  public:
    void set(int newNumber, double newValue, Node* newLink) override {
        ownNumber = newNumber;
        ownValue = newValue;
        ownLink = newLink;
    }
    int number() const override { return ownNumber; }
    double value() const override { return ownValue; }
    Node* link() const override { return ownLink.get(); }

    const QrUid* getClassUid() const override { return &storedNodeUid; }
    unsigned int getVersion() const override { return 1; }

    void write(QrStream& stream) override { stream << ownNumber << ownValue << ownLink.get(); }

    void read(QrStream& stream) override {
        stream >> ownNumber >> ownValue;
        const QrRef<QrCastable> object = stream.readObject(&Node::uid, nullptr, nullptr);
        ownLink = queryCast<Node>(object.get());
    }

  private:
    int ownNumber = 0;
    double ownValue = 0;
    QrPtr<Node> ownLink;
};

} // namespace

} // namespace Mz::Benchmarks

MZ_COMPONENT(L"Nodes", L"Nodes of a graph, for the benchmarks of saved objects",
             Mz::Kit::builderOf<Mz::Benchmarks::StoredNode>({.uid = Mz::Benchmarks::storedNodeUid,
                                                             .name = L"node"}))
