// SPDX-License-Identifier: BSL-1.0
/// Fixture with a folder of component libraries that allocate nothing and call nothing in
/// initialisers, where a failure would end the process, and with recorded lists in memory.
#pragma once

#include "components/componentManager/binaryStream.h"
#include "tests/integration/managerFixture.h"
#include "tests/streams/components/recordedUids.h"
#include "tests/streams/support.h"

namespace Mz::Test {

/// A folder with two component libraries and another file.
class ManagerFaultTest : public ManagerTest {
  protected:
    ManagerFaultTest() {
        for (const auto& entry :
             std::filesystem::directory_iterator(buildFolder / "components" / "recordedLists"))
            std::filesystem::copy_file(entry.path(), folder.path() / entry.path().filename());
        folder.write("zreadme.txt", "no library");
    }

    static QrPtr<QrPersistant> records(ComponentManager& manager) {
        return QrPtr<QrPersistant>::adopt(
            safeCast<QrPersistant>(static_cast<QrComponentManager*>(&manager)));
    }

    std::string list() {
        return written<QrBinaryStream>([&](QrStream& stream) { records(*manager)->write(stream); });
    }

    void read(const std::string& list) {
        Reading<QrBinaryStream> in(list);
        records(*manager)->read(in.stream);
    }

    /// Starts anew with the list of the present start.
    void restartWithList() {
        const std::string present = list();
        restart();
        read(present);
        initialize();
    }

    /// Returns the list of a start without failures. Starts anew.
    std::string wholeList() {
        initialize();
        std::string whole = list();
        restart();
        return whole;
    }

    /// Returns the list of a start of which the first library was switched off: it is recorded
    /// without builders, so that no start loads it. Starts anew.
    std::string listWithoutFirst() {
        initialize();
        for (ComponentLibrary& library : manager->libraries)
            if (library.fileName.view().starts_with(L"recordedfirst"))
                manager->dropBuilders(library);
        std::string partial = list();
        restart();
        return partial;
    }

    /// Returns the file of a library.
    std::filesystem::path fileOf(const std::string& prefix) const {
        for (const auto& entry : std::filesystem::directory_iterator(folder.path()))
            if (entry.path().filename().string().starts_with(prefix))
                return entry.path();
        return {};
    }

    /// Returns whether the manager has loaded a library with this prefix.
    bool isLoaded(std::wstring_view prefix) const {
        for (const ComponentLibrary& library : manager->libraries)
            if (library.fileName.view().starts_with(prefix) && library.module)
                return true;
        return false;
    }

    const Names all{L"alpha", L"beta", L"gamma"};
};

} // namespace Mz::Test
