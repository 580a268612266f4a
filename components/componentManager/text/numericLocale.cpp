// SPDX-License-Identifier: BSL-1.0
/// Chooses between the two ways to the "C" locale by the exact class of the IO. The way without the
/// C library is preferred: it is fast and has no effect on other threads.
#include "components/componentManager/text/numericLocale.h"

#include "components/componentManager/bufferio.h"

#include "components/componentManager/support/noDestructor.h"

#include <typeinfo>

namespace Mz {

namespace {

/// The switch of this library, as the platform layer has no state. Never destroyed: static objects
/// may write streams in their destructors.
platform::LocaleSwitch& localeSwitch() {
    static NoDestructor<platform::LocaleSwitch> instance;
    return instance.value;
}

} // namespace

NumericLocale::NumericLocale(const QrBufferedIO& io) {
    // A derived class may use the C library; only these exact classes are known not to.
    if (typeid(io) == typeid(QrInBuffer) || typeid(io) == typeid(QrOutBuffer))
        ownBuffer.emplace();
    else
        foreignIO.emplace(localeSwitch());
}

} // namespace Mz
