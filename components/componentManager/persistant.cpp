#include "components/componentManager/persistant.h"

#include <utility>

namespace Mz {

QrPersistant::~QrPersistant() = default;

void QrPersistant::loadFinished() {}

void QrPersistant::forceVtblInstantiation() {}

struct QrPostLoadList::Node {
    QrPtr<QrPersistant> object;
    std::shared_ptr<Node> next;
    bool beingTold = false;
    /// No longer part of any list, though somebody may still look at it.
    bool removed = false;

    /// Tells the object and gives it back, which stays when it throws.
    QrPtr<QrPersistant> tell() {
        struct BeingTold {
            bool& flag;
            explicit BeingTold(bool& value) : flag(value) { flag = true; }
            ~BeingTold() { flag = false; }
        } const guard(beingTold);
        if (object)
            object->loadFinished();
        return std::move(object);
    }

    /// Takes the node out of the list that begins with `first`, where it stands first. What follows
    /// is not left with the node: whoever still holds that would hold, and drop, the whole chain.
    void removeFrom(std::shared_ptr<Node>& first) {
        removed = true;
        first = std::move(next);
    }
};

QrPostLoadList::QrPostLoadList() = default;

QrPostLoadList::~QrPostLoadList() {
    // One by one: each node owns the next, and a long chain would be dropped by deep recursion.
    while (first) {
        const std::shared_ptr<Node> node = first;
        node->removeFrom(first);
    }
}

void QrPostLoadList::postLoad(QrPersistant* obj) {
    const auto added = std::make_shared<Node>();
    added->object = obj;
    const std::shared_ptr<Node> behind = last.lock();
    std::shared_ptr<Node>* slot = &first;
    if (behind && !behind->removed)
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
        // An object may move its list to another one while it is told. If that is told as well, the
        // object is not told a second time; if it is not, the node left there holds nobody.
        QrPtr<QrPersistant> told;
        if (!node->beingTold)
            told = node->tell();
        if (first == node)
            node->removeFrom(first);
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
