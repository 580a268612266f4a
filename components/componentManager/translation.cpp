// SPDX-License-Identifier: BSL-1.0
/// Implements the registry of translators: a hash map from the address of the translated object to
/// its list of translators.
///
/// The map is constant-initialised and never destroyed, so that static objects of other libraries
/// can use it at any time; its memory is freed at unload. It takes no lock: concurrent lookups only
/// read, and callers serialise changes.
#include "components/componentManager/translation.h"

#include "components/componentManager/cast.h"
#include "components/componentManager/support/hashMap.h"
#include "components/componentManager/support/noDestructor.h"

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

namespace Mz {

namespace {

struct Translation {
    QrCastable* translator;
    bool (*accepts)(const QrUid& uid);
};

struct AddressHash {
    std::uintptr_t operator()(const QrCastable* object) const {
        return reinterpret_cast<std::uintptr_t>(object);
    }
};

/// The translations by translated object, which is only an address here. Its key stays in the map
/// after its last translation was removed.
constinit NoDestructor<HashMap<QrCastable*, std::vector<Translation>, AddressHash>> registry;

void clearRegistry() {
    registry.value.clear();
}
MZ_AT_UNLOAD(clearRegistry);

} // namespace

constinit std::atomic<bool> detail::translationsExist{false};

} // namespace Mz

using namespace Mz;

QrCastable* QrTranslateInterface(QrCastable* object, const QrUid& uid) {
    const std::vector<Translation>* translations = registry.value.find(object);
    if (!translations)
        return nullptr;
    // An index and a copy, not an iterator: the callbacks may add or remove translations.
    for (std::size_t index = 0; index < translations->size(); ++index) {
        const Translation translation = (*translations)[index];
        if (translation.accepts(uid))
            return translation.translator->getInterface(uid);
    }
    return nullptr;
}

void QrAddTranslation(QrCastable* object, QrCastable* translator,
                      bool (*accepts)(const QrUid& uid)) {
    if (!object || !translator || !accepts)
        return;
    registry.value[object].push_back({translator, accepts});
    detail::translationsExist.store(true, std::memory_order_relaxed);
}

void QrRemoveTranslation(QrCastable* object, QrCastable* translator) {
    std::vector<Translation>* translations = registry.value.find(object);
    if (!translations)
        return;
    // Skips the entry that moves into the place of a removed one: callers rely on one call removing
    // only the first of two adjacent entries.
    for (std::size_t index = 0; index < translations->size(); ++index)
        if ((*translations)[index].translator == translator)
            translations->erase(translations->begin() + static_cast<std::ptrdiff_t>(index));
}
