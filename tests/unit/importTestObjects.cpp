// SPDX-License-Identifier: BSL-1.0
// Adds a library record without a file to the process-wide manager. Its entry point returns a
// description that returns the tests' builders.
#include "tests/unit/importTestObjects.h"

namespace Mz::Test {

namespace {

/// A description that returns the tests' builders.
class TestDescription final : public QrCastImpl<TestDescription, QrComponentDescription> {
  public:
    QrRef<QrCastable> createBuilder(const QrUid& uid) override {
        for (const auto& [known, builder] : builders)
            if (known == uid)
                return builder;
        return nullptr;
    }
    int64 getComponentValue() override { return 0; }
    const wchar_t* getComponentLabel() override { return L""; }
    const wchar_t* getComponentText() override { return L""; }
    unsigned int getBuilderCount() override { return static_cast<unsigned int>(builders.size()); }
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        return e.finished();
    }

    std::vector<std::pair<QrUid, QrRef<QrCastable>>> builders;
};

TestDescription& description() {
    static TestDescription instance;
    return instance;
}

QrCastable* describe() {
    return &description();
}

} // namespace

ComponentManager& TestLibrary::manager() {
    return *static_cast<ComponentManager*>(QrGetComponentManager());
}

TestLibrary::TestLibrary() {
    library = manager().libraries.emplace(manager().libraries.end(), manager());
    // A non-null module marks the library as loaded by the host: the manager does not unload it.
    library->module = this;
    library->entryPoint = describe;
    manager().initialised = true;
}

TestLibrary::~TestLibrary() {
    manager().initialised = false;
    manager().libraries.erase(library);
    description().builders.clear();
}

void TestLibrary::add(const QrUid& uid, const wchar_t* name, const QrRef<QrCastable>& builder) {
    ComponentManager::Builder& record = library->builders.emplace_back();
    record.library = &*library;
    record.uid = uid;
    record.name = name;
    description().builders.emplace_back(uid, builder);
}

} // namespace Mz::Test
