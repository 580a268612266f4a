// SPDX-License-Identifier: BSL-1.0
// Qt 6: casts to an interface, and plug-ins.
#include "measure.h"
#include "peers/qtTypes.h"
#include "peers/registration.h"
#include "peers/starts.h"

namespace Mz::Benchmarks {

namespace {

template <class Interface>
void cast(benchmark::State& state) {
    const std::unique_ptr<QObject> object(newQtGauge());
    repeat(state, [&object] { opaque(qobject_cast<Interface*>(opaque(object.get()))); });
}

void addPeer(RatioTable& table) {
    table.addPeer("cast/uncounted", "qobject_cast", cast<QtGauge>);
    table.addPeer("cast/null", "qobject_cast", cast<QtAbsent>);
    addFirstStarts(table, "QPluginLoader", MZ_PEER_PLUGIN, MZ_PEER_START, "load");
    addRecordedStarts(table, "QPluginLoader (metadata)", MZ_PEER_PLUGIN, MZ_PEER_START, "metaData",
                      "metaData");
}

const PeerRegistration registration(addPeer);

} // namespace

} // namespace Mz::Benchmarks
