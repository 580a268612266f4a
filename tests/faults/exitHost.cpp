// SPDX-License-Identifier: BSL-1.0
/// A host that uses everything of the component `exiting`, which may call `exit` anywhere.
///
///     exitHost FOLDER FILE
///
/// Imports FILE. Exits with 7 if the component did not call `exit`. Prints what the destructors of
/// its static objects find: the manager and its registries must still be usable.
#include "components/componentKit/hostKit.h"
#include "components/componentManager/binaryStream.h"
#include "tests/faults/components/exiting.h"

#include <cstdio>
#include <filesystem>
#include <sstream>

using namespace Mz;
using namespace Mz::Test;

namespace {

/// Destroyed while the process ends.
struct AtEnd {
    ~AtEnd() {
        Kit::builders();
        QrAddTranslation(QrGetComponentManager(), QrGetComponentManager(),
                         [](const QrUid&) { return false; });
        QrSetThreadProcessController(QrGetSystemProcessController());
        QrSetThreadProcessController(nullptr);
        std::puts("end");
    }
} atEnd;

void useObject() {
    std::stringstream bytes;
    QrOutBuffer out(&bytes);
    QrInBuffer in(&bytes);
    QrBinaryStream writing(&out), reading(&in);
    const QrRef<QrCastable> object = QrGetComponentManager()->createObject(exitingUid);
    const QrPtr<QrPersistant> stored = queryCast<QrPersistant>(object.get());
    if (!stored) {
        std::puts("no object");
        return;
    }
    object->getInterface(exitingImporterUid);
    QrTranslateInterface(object.get(), exitingImporterUid);
    stored->write(writing);
    stored->read(reading);
}

} // namespace

int main(int argc, char** argv) {
    if (argc < 3)
        return 2;
    Kit::initialize(std::filesystem::path(argv[1]));
    useObject();
    Kit::importFile(L"exit", std::filesystem::path(argv[2]));
    bool found = false;
    Kit::newImporter<L"exit">()->import(std::filesystem::path(argv[2]).wstring().c_str(), nullptr,
                                        found);
    constexpr int nothingExited = 7;
    return nothingExited;
}
