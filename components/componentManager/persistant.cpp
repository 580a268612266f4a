#include "components/componentManager/persistant.h"

#include <utility>

namespace Mz {

QrPersistant::~QrPersistant() = default;

void QrPersistant::loadFinished() {}

void QrPersistant::forceVtblInstantiation() {}

struct QrPostLoadList::Node {
    QrPtr<QrPersistant> object;
    std::shared_ptr<Node> next;
    bool told = false;
};

QrPostLoadList::QrPostLoadList() = default;

QrPostLoadList::~QrPostLoadList() {
    // One by one: each node owns the next, and a long chain would be dropped by deep recursion.
    while (first)
        first = std::move(first->next);
}

void QrPostLoadList::postLoad(QrPersistant* obj) {
    const auto added = std::make_shared<Node>();
    added->object = obj;
    const std::shared_ptr<Node> behind = last.lock();
    std::shared_ptr<Node>* slot = &first;
    if (behind && !behind->told)
        slot = &behind->next;
    else
        while (*slot)
            slot = &(*slot)->next;
    added->next = std::move(*slot);
    *slot = added;
    last = added;
}

void QrPostLoadList::loadFinished() {
    if (telling)
        return;
    struct Telling {
        bool& flag;
        explicit Telling(bool& value) : flag(value) { flag = true; }
        ~Telling() { flag = false; }
    } const guard(telling);

    while (first) {
        const std::shared_ptr<Node> node = first;
        if (node->object)
            node->object->loadFinished();
        node->told = true;
        // The object may have moved the whole list, itself included, to another one, which passes
        // over the node since it holds nobody any more.
        const QrPtr<QrPersistant> object = std::move(node->object);
        if (first == node)
            first = node->next;
    }
}

void QrPostLoadList::transfer(QrPostLoadList& other) {
    if (&other == this || !first)
        return;
    std::shared_ptr<Node>* end = &other.first;
    while (*end)
        end = &(*end)->next;
    *end = std::move(first);
}

} // namespace Mz
