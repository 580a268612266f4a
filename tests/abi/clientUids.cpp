// SPDX-License-Identifier: BSL-1.0
/// A client that uses the uid of every interface, so that it fails to link if the library lacks
/// one.
#include "components/componentManager/componentImp.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/processControl.h"

using namespace Mz;

int main() {
    QrCastable* const object = QrGetComponentManager();
    return !queryCast<QrComponentManager>(object) || queryCast<QrBufferedIO>(object) ||
           queryCast<QrBuilderDescription>(object) || queryCast<QrComponentBuilder>(object) ||
           queryCast<QrComponentDescription>(object) || queryCast<QrImportBuilder>(object) ||
           queryCast<QrImporter>(object) || queryCast<QrProcessControl>(object);
}
