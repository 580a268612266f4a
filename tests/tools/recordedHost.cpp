// SPDX-License-Identifier: BSL-1.0
/// A host program that starts with a recorded list and reports what it loaded.
///
///     recordedHost LIST PATH
///
/// A search can give it another list.
///
/// Prints the number of builders, the number of candidate files that are mapped, the events of the
/// libraries ("no word" if there are none), and then how many builders create an object.
#include "tests/tools/recordedHost.h"
#include "tests/components/testUids.h"
#include "tests/support/testSystem.h"

#include "components/componentKit/recordedList.h"
#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/persistant.h"

#include <clocale>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <string>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Collector final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> item) override {
        uids.push_back(item->getUid());
        return Continue;
    }
    std::vector<QrUid> uids;
};

void readList(const std::filesystem::path& list) {
    std::ifstream file(list, std::ios::binary);
    QrInBuffer buffer(&file);
    QrBinaryStream stream(&buffer);
    const auto companion =
        QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
    companion->read(stream);
}

int mappedFiles(const std::filesystem::path& folder) {
    int count = 0;
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        count += isMapped(entry.path());
    return count;
}

} // namespace

int mzTestHostNumber() {
    return 42;
}

int main(int, char** argv) {
    std::setlocale(LC_ALL, "");
    readList(Kit::listFromEnvironment(argv[1]));
    const std::filesystem::path folder = argv[2];
    QrGetComponentManager()->initialize(searchPathOf(folder).c_str());
    Collector collector;
    QrGetComponentManager()->enumerateBuilders(collector);
    std::printf("%d builders, %d mapped, %s\n", static_cast<int>(collector.uids.size()),
                mappedFiles(folder), *allNotes() ? allNotes() : "no word");
    int made = 0;
    for (const QrUid& uid : collector.uids)
        made += QrGetComponentManager()->createObject(uid) ? 1 : 0;
    std::printf("%d made\n", made);
}
