// SPDX-License-Identifier: BSL-1.0
/// A component manager of the test's own, and a folder for the libraries that it is to find.
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

/// The file of a component library that was built for the tests.
inline std::filesystem::path builtComponent(const std::wstring& name) {
    return buildFolder / "components" / name / (name + MZ_LIBRARY_EXTENSION);
}

/// Writes down which builders it is offered.
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

    /// A new, empty manager; the old one is gone, and so are the libraries that it loaded.
    void restart() {
        manager.reset();
        manager = std::make_unique<ComponentManager>();
    }

    /// The names of all builders, in the order of the enumeration.
    Names names() {
        Collector collector;
        manager->enumerateBuilders(collector);
        return collector.names;
    }

    /// The record of a file of the folder; null when there is none.
    ComponentLibrary* find(const std::filesystem::path& file) {
        const std::wstring wanted =
            ComponentManager::normalisePath(file.filename().wstring().c_str(), false);
        for (ComponentLibrary& library : manager->libraries)
            if (library.fileName == wanted)
                return &library;
        return nullptr;
    }

    /// Appends the record that an earlier start would have left of the file.
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

    /// The builder that the manager knows for the identifier; null when it knows none.
    ComponentManager::Builder* indexed(const QrUid& uid) {
        ComponentManager::Builder** found = manager->builderIndex.find(uid);
        return found ? *found : nullptr;
    }

    /// Who made the object that the manager creates for the identifier; empty without an object.
    std::string maker(const QrUid& uid) {
        const QrRef<QrCastable> object = manager->createObject(uid);
        const QrPtr<PlainObject> plain = queryCast<PlainObject>(object.get());
        return plain ? plain->maker() : "";
    }

    TemporaryDirectory folder;
    std::unique_ptr<ComponentManager> manager;
};

} // namespace Mz::Test
