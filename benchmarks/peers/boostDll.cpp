// SPDX-License-Identifier: BSL-1.0
// Boost.DLL: plug-ins with an alias.
#include "peers/registration.h"
#include "peers/starts.h"

namespace Mz::Benchmarks {

namespace {

void addPeer(RatioTable& table) {
    addFirstStarts(table, "Boost.DLL", MZ_PEER_PLUGIN, MZ_PEER_START, "load");
    addRecordedStarts(table, "Boost.DLL (library_info)", MZ_PEER_PLUGIN, MZ_PEER_START, "query",
                      "query");
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
