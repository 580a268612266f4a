/// A depth for each thread, so that scopes nest and no other thread notices them.
#include "components/componentManager/text/plainBytes.h"

#include "components/platform/platform.h"

namespace Mz {

namespace {

constinit thread_local int depth = 0;

} // namespace

PlainBytes::PlainBytes() {
    ++depth;
}

PlainBytes::~PlainBytes() {
    --depth;
}

platform::CharacterConverter bufferedConverter() {
    return platform::CharacterConverter(depth > 0 || platform::usesPlainBytes());
}

} // namespace Mz
