#include "components/componentManager/translation.h"

#include "components/componentManager/cast.h"
#include "components/componentManager/support/hashMap.h"
#include "components/componentManager/support/noDestructor.h"

#include <atomic>
#include <cstddef>
#include <cstdint>
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

/// By translated object, which is only an address here. An object that once had translations keeps
/// its place, empty.
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
    // By index, and with the translator copied: whoever is called here may add or remove.
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
    // The entry that moves up into a removed one's place is passed over; callers rely on one call
    // removing one of two neighbours.
    for (std::size_t index = 0; index < translations->size(); ++index)
        if ((*translations)[index].translator == translator)
            translations->erase(translations->begin() + static_cast<std::ptrdiff_t>(index));
}
