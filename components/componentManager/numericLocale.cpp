#include "components/componentManager/numericLocale.h"

#include "components/componentManager/bufferio.h"

#include <typeinfo>

namespace Mz {

NumericLocale::NumericLocale(const QrBufferedIO& io) {
    // A derived class may do anything; only what is exactly ours is known not to look.
    if (typeid(io) == typeid(QrInBuffer) || typeid(io) == typeid(QrOutBuffer))
        ownBuffer.emplace();
    else
        foreignIO.emplace();
}

} // namespace Mz
