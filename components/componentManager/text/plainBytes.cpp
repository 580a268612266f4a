// SPDX-License-Identifier: BSL-1.0
/// Counts the depth of the scopes for each thread, so that they nest and do not affect other
/// threads. The count is in a word of the platform layer, which leaves no heap memory when the
/// library is unloaded.
#include "components/componentManager/text/plainBytes.h"

#include "components/base/export.h"
#include "components/platform/platform.h"

// From the folder of the platform.
#include "threadWord.h"

#include <new>

namespace Mz {

namespace {

using Depth = platform::ThreadWord<struct PlainBytesDepth>;

void releaseDepth() {
    Depth::release();
}
MZ_AT_UNLOAD(releaseDepth);

} // namespace

PlainBytes::PlainBytes() {
    if (!Depth::set(Depth::get() + 1))
        throw std::bad_alloc();
}

PlainBytes::~PlainBytes() {
    Depth::set(Depth::get() - 1);
}

platform::CharacterConverter bufferedConverter() {
    return platform::CharacterConverter(Depth::get() > 0 || platform::usesPlainBytes());
}

} // namespace Mz
