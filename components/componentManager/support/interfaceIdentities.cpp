// SPDX-License-Identifier: BSL-1.0
/// Exports the uids of all interfaces.
///
/// Clients on Windows import each uid from this library. A uid is defined in a header, so it is
/// exported only if the library itself uses it. This file uses them all.
#include "components/componentManager/componentImp.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/processControl.h"

namespace Mz {

/// The address of every uid. `used` keeps the array, which no code reads.
[[gnu::used]] const QrUid* const interfaceIdentities[] = {
    &QrBufferedIO::uid,    &QrBuilderDescription::uid,   &QrComponentBuilder::uid,
    &QrImportBuilder::uid, &QrComponentDescription::uid, &QrComponentManager::uid,
    &QrImporter::uid,      &QrProcessControl::uid,       &QrPersistant::uid,
};

} // namespace Mz
