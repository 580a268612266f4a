// SPDX-License-Identifier: BSL-1.0
/// Asks the manager for `QrPersistant` and passes it a binary stream on a file. The list is
/// replaced in one step, so that a start never finds half a list.
#include "recordedList.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/files.h"

#include <fstream>
#include <ostream>

using namespace Mz;

namespace Meshes {

namespace {

/// Returns the interface of the manager that reads and writes the list.
QrPtr<QrPersistant> companion() {
    return QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
}

} // namespace

bool readRecordedList(const std::filesystem::path& file) {
    std::ifstream in(file, std::ios::binary);
    if (!in)
        return false;
    QrInBuffer bytes(&in);
    QrBinaryStream stream(&bytes); // Text would not carry the names.
    companion()->read(stream);
    return true;
}

void writeRecordedList(const std::filesystem::path& file) {
    replaceFile(file, [](std::ostream& out) {
        QrOutBuffer bytes(&out);
        QrBinaryStream stream(&bytes);
        companion()->write(stream);
    });
}

} // namespace Meshes
