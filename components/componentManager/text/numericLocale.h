// SPDX-License-Identifier: BSL-1.0
/// Scope in which a stream reads or writes text in the "C" locale.
#pragma once

#include "components/componentManager/text/plainBytes.h"
#include "components/platform/platform.h"

#include <optional>

namespace Mz {

class QrBufferedIO;

/// While an object lives, its IO converts characters as in the "C" locale on the calling thread.
///
/// `QrInBuffer` and `QrOutBuffer` use `PlainBytes`. Any other IO may use the C library, so its
/// locale is switched: for the calling thread where the system supports that, else for the process
/// (`platform::CLocale` describes the effect on other threads).
class NumericLocale {
  public:
    explicit NumericLocale(const QrBufferedIO& io);

  private:
    std::optional<PlainBytes> ownBuffer;
    std::optional<platform::CLocale> foreignIO;
};

} // namespace Mz
