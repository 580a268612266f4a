// SPDX-License-Identifier: BSL-1.0
// GStreamer: starts without and with its registry.
#include "peers/registration.h"
#include "peers/starts.h"

namespace Mz::Benchmarks {

namespace {

void addPeer(RatioTable& table) {
    addFirstStarts(table, "GStreamer", MZ_PEER_PLUGIN, MZ_PEER_START, "first");
    addRecordedStarts(table, "GStreamer (registry)", MZ_PEER_PLUGIN, MZ_PEER_START, "recorded",
                      "first");
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
