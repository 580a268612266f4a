// SPDX-License-Identifier: BSL-1.0
// POCO: casts of counted objects, and plug-ins of its class loader.
#include "measure.h"
#include "peers/pocoTypes.h"
#include "peers/registration.h"
#include "peers/starts.h"

#include <Poco/AutoPtr.h>

namespace Mz::Benchmarks {

namespace {

void cast(benchmark::State& state) {
    const Poco::AutoPtr<Poco::RefCountedObject> object(newPocoGauge());
    repeat(state, [&object] {
        const Poco::AutoPtr<PocoGauge> gauge = opaque(&object)->cast<PocoGauge>();
        opaque(gauge.get());
    });
}

void addPeer(RatioTable& table) {
    table.addPeer("cast/counted", "Poco::AutoPtr::cast", cast);
    addFirstStarts(table, "Poco::ClassLoader", MZ_PEER_PLUGIN, MZ_PEER_START, "load");
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
