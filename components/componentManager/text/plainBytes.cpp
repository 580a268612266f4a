/// A depth for each thread, so that scopes nest and no other thread notices them. The word that holds
/// it takes no heap memory that would stay when the library is unloaded.
#include "components/componentManager/text/plainBytes.h"

#include "components/base/export.h"
#include "components/platform/platform.h"

// Of the system that the build is for.
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
