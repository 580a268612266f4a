// SPDX-License-Identifier: BSL-1.0
/// Fixture with a component manager of its own and a temporary folder for its component libraries.
#pragma once

#include "components/componentManager/manager/componentImpPrivate.h"
#include "tests/components/testUids.h"
#include "tests/support/temporaryDirectory.h"
#include "tests/support/testSystem.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace Mz::Test {

inline const std::filesystem::path buildFolder = MZ_BUILD_PATH;

/// Returns the path of a component library that the build made for the tests.
inline std::filesystem::path builtComponent(const std::wstring& name) {
    return buildFolder / "components" / name / (name + MZ_LIBRARY_EXTENSION);
}

/// Collects the names of the builders that it is offered.
class Collector final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> item) override {
        names.emplace_back(item->getName());
        items.push_back(item.get());
        return names.size() == stopAt ? verdict : Continue;
    }
    Action finished() override {
        ++timesFinished;
        return atEnd;
    }

    std::vector<std::wstring> names;
    std::vector<const QrBuilderDescription*> items;
    std::size_t stopAt = 0;
    Action verdict = Stop;
    Action atEnd = Continue;
    int timesFinished = 0;
};

class ManagerTest : public ::testing::Test {
  protected:
    using Names = std::vector<std::wstring>;

    ManagerTest() : manager(std::make_unique<ComponentManager>()) {
        forgetNotes();
        setHook(nullptr);
        setManagerUnderTest(nullptr);
    }
    ~ManagerTest() override {
        manager.reset();
        setManagerUnderTest(nullptr);
        setHook(nullptr);
    }

    /// Copies a test component to the folder, as `name` if given, and returns its new path.
    std::filesystem::path add(const std::wstring& component,
                              const std::filesystem::path& name = {}) {
        const std::filesystem::path source = builtComponent(component);
        std::filesystem::path target = folder.path() / (name.empty() ? source.filename() : name);
        std::filesystem::remove(target);
        std::filesystem::copy_file(source, target);
        return target;
    }

    void initialize() { manager->initialize(searchPathOf(folder.path()).c_str()); }

    /// Replaces the manager with a new one. This unloads the libraries that the old one loaded.
    void restart() {
        manager.reset();
        manager = std::make_unique<ComponentManager>();
    }

    /// Returns the names of all builders in the order of the enumeration.
    Names names() {
        Collector collector;
        manager->enumerateBuilders(collector);
        return collector.names;
    }

    /// Returns the record of a file of the folder, or null.
    ComponentLibrary* find(const std::filesystem::path& file) {
        const std::wstring wanted =
            ComponentManager::normalisePath(file.filename().wstring().c_str(), false);
        for (ComponentLibrary& library : manager->libraries)
            if (library.fileName == wanted)
                return &library;
        return nullptr;
    }

    /// Appends a record such as an earlier start stores. `asItIs` gives it the file's time and
    /// size.
    ComponentLibrary& record(const std::filesystem::path& file, bool asItIs = true) {
        ComponentLibrary& library = manager->libraries.emplace_back(*manager);
        library.directory =
            ComponentManager::normalisePath(searchPathOf(file.parent_path()).c_str(), false);
        library.fileName =
            ComponentManager::normalisePath(file.filename().wstring().c_str(), false);
        library.foundPath = file;
        const std::optional<platform::FileStatus> status = platform::queryFile(file);
        if (status && asItIs)
            library.noteFile(*status);
        return library;
    }

    static ComponentManager::Builder& recordBuilder(ComponentLibrary& library, const QrUid& uid,
                                                    const wchar_t* name) {
        ComponentManager::Builder& builder = library.builders.emplace_back();
        builder.library = &library;
        builder.uid = uid;
        builder.name = name;
        return builder;
    }

    /// Returns the builder that the index has for `uid`, or null.
    ComponentManager::Builder* indexed(const QrUid& uid) {
        ComponentManager::Builder** found = manager->builderIndex.find(uid);
        return found ? *found : nullptr;
    }

    /// Creates an object for `uid` and returns the name of its maker, or "" if there is no object.
    std::string maker(const QrUid& uid) {
        const QrRef<QrCastable> object = manager->createObject(uid);
        const QrPtr<PlainObject> plain = queryCast<PlainObject>(object.get());
        return plain ? plain->maker() : "";
    }

    TemporaryDirectory folder;
    std::unique_ptr<ComponentManager> manager;
};

} // namespace Mz::Test
