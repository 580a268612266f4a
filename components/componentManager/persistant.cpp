// SPDX-License-Identifier: BSL-1.0
/// Post-load lists are chains of nodes, each of which owns the next. A list knows its last node by
/// a weak pointer, as that may move to another list or end with its notification. Objects may
/// change the lists from within `loadFinished`: the loop keeps the current node alive, and flags in
/// the node show what has happened to it meanwhile.
#include "components/componentManager/persistant.h"

#include <utility>

namespace Mz {

QrPersistant::~QrPersistant() = default;

void QrPersistant::loadFinished() {}

void QrPersistant::forceVtblInstantiation() {}

struct QrPostLoadList::Node {
    QrPtr<QrPersistant> object;
    std::shared_ptr<Node> next;
    bool beingNotified = false;
    /// Whether the node has left its list. It may still be referenced.
    bool removed = false;

    /// Notifies the object and returns its reference. If it throws, the node keeps the reference.
    QrPtr<QrPersistant> notify() {
        struct BeingNotified {
            bool& flag;
            explicit BeingNotified(bool& value) : flag(value) { flag = true; }
            ~BeingNotified() { flag = false; }
        } const guard(beingNotified);
        if (object)
            object->loadFinished();
        return std::move(object);
    }

    /// Removes the node, which is the first, from the list that begins with `first`. The node does
    /// not keep its successor: a reference to the node would keep, and free, the whole chain.
    void removeFrom(std::shared_ptr<Node>& first) {
        removed = true;
        first = std::move(next);
    }
};

QrPostLoadList::QrPostLoadList() = default;

QrPostLoadList::~QrPostLoadList() {
    // One by one: each node owns the next, and freeing a long chain at once recurses deeply.
    while (first) {
        const std::shared_ptr<Node> node = first;
        node->removeFrom(first);
    }
}

void QrPostLoadList::postLoad(QrPersistant* obj) {
    const auto added = std::make_shared<Node>();
    added->object = obj;
    const std::shared_ptr<Node> previous = last.lock();
    std::shared_ptr<Node>* slot = &first;
    if (previous && !previous->removed)
        slot = &previous->next;
    else
        while (*slot)
            slot = &(*slot)->next;
    added->next = std::move(*slot);
    *slot = added;
    last = added;
}

void QrPostLoadList::loadFinished() {
    if (notifying)
        return;
    struct Notifying {
        bool& flag;
        explicit Notifying(bool& value) : flag(value) { flag = true; }
        ~Notifying() { flag = false; }
    } const guard(notifying);

    while (first) {
        const std::shared_ptr<Node> node = first;
        // During its notification an object may move this list to another one. If that list is
        // notified too, the object is skipped; if not, the node in it has no object any more.
        QrPtr<QrPersistant> notified;
        if (!node->beingNotified)
            notified = node->notify();
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
