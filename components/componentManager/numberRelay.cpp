// SPDX-License-Identifier: BSL-1.0
/// A table of a few classes, which is read for each number of a foreign IO and rarely changed.
/// Readers take no lock: they compare addresses only, and the object of a class that they find
/// keeps its entry in the table. An entry's class is stored last and removed first.
#include "components/componentManager/numberRelay.h"

#include "components/componentManager/buffers/numberPath.h"

#include <array>
#include <atomic>

namespace Mz {

namespace {

struct Entry {
    std::atomic<const std::type_info*> exactClass{nullptr};
    QrNumberRelay::Functions functions;
};

/// Constant-initialised and never destroyed: static objects of other libraries use it.
constinit std::array<Entry, QrNumberRelay::maximumCount> entries;

/// The number of entries that were ever used, so that readers do not look at the others.
constinit std::atomic<int> usedEntries{0};

/// Marks an entry that is being filled. Never the class of an object.
const std::type_info* const reserved = &typeid(Entry);

} // namespace

QrNumberRelay::QrNumberRelay(const std::type_info& exactClass, const Functions& functions) {
    for (int index = 0; index < maximumCount; ++index) {
        Entry& entry = entries[static_cast<std::size_t>(index)];
        const std::type_info* expected = nullptr;
        if (!entry.exactClass.compare_exchange_strong(expected, reserved))
            continue;
        entry.functions = functions;
        entry.exactClass.store(&exactClass);
        for (int used = usedEntries.load(); used <= index;)
            if (usedEntries.compare_exchange_weak(used, index + 1))
                break;
        slot = index;
        return;
    }
}

QrNumberRelay::~QrNumberRelay() {
    if (slot >= 0)
        entries[static_cast<std::size_t>(slot)].exactClass.store(nullptr);
}

NumberPath::NumberPath(QrBufferedIO& io) : io(io) {
    const std::type_info& type = typeid(io);
    const int used = usedEntries.load(std::memory_order_acquire);
    for (int index = 0; index < used; ++index) {
        const Entry& entry = entries[static_cast<std::size_t>(index)];
        if (entry.exactClass.load(std::memory_order_acquire) == &type) {
            functions = entry.functions;
            return;
        }
    }
}

QrBufferedIO& NumberPath::output() const {
    QrBufferedIO* const target = functions.output ? functions.output(io) : nullptr;
    return target ? *target : io;
}

void NumberPath::noteNumber(char separator) const {
    if (functions.noteNumber)
        functions.noteNumber(io, separator);
}

QrBufferedIO& NumberPath::input() const {
    QrBufferedIO* const source = functions.input ? functions.input(io) : nullptr;
    return source ? *source : io;
}

void NumberPath::noteRead(int bytes) const {
    if (functions.noteRead)
        functions.noteRead(io, bytes);
}

} // namespace Mz
