/// The "C" locale for as long as a stream reads or writes text.
#pragma once

#include "components/componentManager/text/plainBytes.h"
#include "components/platform/platform.h"

#include <optional>

namespace Mz {

class QrBufferedIO;

/// While it lives, `io` converts characters as in the "C" locale on the calling thread.
///
/// The library's own buffers are only told so. Any other IO may ask the C library, whose locale is
/// therefore switched: for the calling thread where the system can do that, else for the process
/// (`platform::CLocale` says what that means for other threads).
class NumericLocale {
  public:
    explicit NumericLocale(const QrBufferedIO& io);

  private:
    std::optional<PlainBytes> ownBuffer;
    std::optional<platform::CLocale> foreignIO;
};

} // namespace Mz
