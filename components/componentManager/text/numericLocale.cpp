#include "components/componentManager/text/numericLocale.h"

#include "components/componentManager/bufferio.h"

#include "components/componentManager/support/noDestructor.h"

#include <typeinfo>

namespace Mz {

namespace {

/// The library's own, as the platform layer has no state. It is never destroyed, because static
/// objects may write streams in their destructors.
platform::LocaleSwitch& localeSwitch() {
    static NoDestructor<platform::LocaleSwitch> instance;
    return instance.value;
}

} // namespace

NumericLocale::NumericLocale(const QrBufferedIO& io) {
    // A derived class may do anything; only what is exactly ours is known not to look.
    if (typeid(io) == typeid(QrInBuffer) || typeid(io) == typeid(QrOutBuffer))
        ownBuffer.emplace();
    else
        foreignIO.emplace(localeSwitch());
}

} // namespace Mz
