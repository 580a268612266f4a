#include "components/componentManager/componentImp.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/persistant.h"
#include "components/componentManager/processControl.h"

namespace Mz {

/// Uses every identity: clients on Windows import them from this library, where one that is defined
/// in a header is exported only if the library uses it itself.
[[gnu::used]] const QrUid* const interfaceIdentities[] = {
    &QrBufferedIO::uid,    &QrBuilderDescription::uid,   &QrComponentBuilder::uid,
    &QrImportBuilder::uid, &QrComponentDescription::uid, &QrComponentManager::uid,
    &QrImporter::uid,      &QrProcessControl::uid,       &QrPersistant::uid,
};

} // namespace Mz
