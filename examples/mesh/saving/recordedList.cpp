#include "recordedList.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/files.h"

#include <fstream>
#include <ostream>

using namespace Mz;

namespace Meshes {

namespace {

/// The companion that reads and writes on the manager's behalf.
QrPtr<QrPersistant> companion() {
    return QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
}

} // namespace

bool readRecordedList(const std::filesystem::path& file) {
    std::ifstream in(file, std::ios::binary);
    if (!in)
        return false;
    QrInBuffer bytes(&in);
    QrBinaryStream stream(&bytes); // Names are strings, which text does not carry.
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
