// SPDX-License-Identifier: BSL-1.0
/// Scope in which buffered IO converts characters as in the "C" locale.
#pragma once

#include "components/componentManager/support/internalExport.h"
#include "components/platform/characters.h"

namespace Mz {

/// While an object lives, `bufferedConverter` converts as in the "C" locale on the calling thread,
/// whatever the locale is. May be nested.
class MZ_INTERNAL_API PlainBytes {
  public:
    PlainBytes();
    ~PlainBytes();
    PlainBytes(const PlainBytes&) = delete;
    PlainBytes& operator=(const PlainBytes&) = delete;
};

/// Returns the converter that buffered IO uses at the moment on the calling thread.
MZ_INTERNAL_API platform::CharacterConverter bufferedConverter();

} // namespace Mz
