// SPDX-License-Identifier: BSL-1.0
/// Import builders that a test controls, registered in the process-wide manager.
#pragma once

#include "components/componentKit/componentKit.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/manager/componentImpPrivate.h"

#include <functional>
#include <memory>
#include <string>
#include <vector>

namespace Mz::Test {

/// The interface of the objects that a test import builder creates.
class Imported : public QrCastable {
  public:
    using Self = Imported;
    static constexpr QrUid uid{0x7D2E0001, 0x33B14C5A, 0x9A40C6D1, 0x20F7E8B3};
    virtual const std::wstring& madeBy() const = 0;
};

class ImportedObject final : public QrCastRef<QrCastHeap<QrCastImpl<ImportedObject, Imported>>> {
  public:
    explicit ImportedObject(std::wstring maker) : maker(std::move(maker)) { ++alive; }
    ~ImportedObject() override { --alive; }
    const std::wstring& madeBy() const override { return maker; }

    static inline int alive = 0;

  private:
    std::wstring maker;
};

/// Returns the label of the builder that made `object`, or "" for null.
inline std::wstring makerOf(const QrRef<QrCastable>& object) {
    const QrPtr<Imported> imported = queryCast<Imported>(object.get());
    return imported ? imported->madeBy() : L"";
}

using Calls = std::vector<std::wstring>;

/// Records every call and answers with the test's callbacks.
class TestImportBuilder final : public Kit::Builder<TestImportBuilder, QrImportBuilder> {
  public:
    TestImportBuilder(const Kit::BuilderInfo& info, std::vector<const wchar_t*> extensions,
                      Calls& calls)
        : Builder(info), extensions(std::move(extensions)), calls(calls) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>& e) const override {
        calls.push_back(std::wstring(getLabel()) + L" extensions");
        if (onExtensions)
            return onExtensions(e);
        for (const wchar_t* extension : extensions)
            if (const QrEnum::Action action = e.process(extension))
                return action;
        return e.finished();
    }

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t* path,
                   const wchar_t* hint) const override {
        note(L"can", path, hint);
        return onCanImport ? onCanImport(*io) : false;
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                             const wchar_t* hint) const override {
        note(L"import", path, hint);
        if (onImport && !onImport(*io))
            return nullptr;
        return QrPtr<ImportedObject>(new ImportedObject(getLabel()));
    }

    QrRef<QrCastable> createObject() override { return nullptr; }

    std::function<QrEnum::Action(QrEnumerator<const wchar_t*>&)> onExtensions;
    std::function<bool(QrBufferedIO&)> onCanImport;
    std::function<bool(QrBufferedIO&)> onImport;

  private:
    void note(const wchar_t* what, const wchar_t* path, const wchar_t* hint) const {
        calls.push_back(std::wstring(getLabel()) + L" " + what + L" [" + (path ? path : L"(null)") +
                        L"] [" + (hint ? hint : L"(null)") + L"]");
    }

    std::vector<const wchar_t*> extensions;
    Calls& calls;
};

/// A registered builder that is not an import builder.
class PlainBuilder final : public Kit::Builder<PlainBuilder> {
  public:
    using Builder::Builder;
    QrRef<QrCastable> createObject() override { return nullptr; }
};

/// A library record without a file in the process-wide manager, for the builders of a test.
class TestLibrary {
  public:
    TestLibrary();
    ~TestLibrary();
    TestLibrary(const TestLibrary&) = delete;
    TestLibrary& operator=(const TestLibrary&) = delete;

    /// Adds a builder record for `builder`, which may be null.
    void add(const QrUid& uid, const wchar_t* name, const QrRef<QrCastable>& builder);

    /// Returns the process-wide manager.
    static ComponentManager& manager();

  private:
    ComponentManager::LibraryList::iterator library;
};

/// An importer for the builders named "test", unless the test changes `name`.
class TestImporter : public QrCastImpl<TestImporter, QrBaseImporter> {
  public:
    const wchar_t* getBuilderName() const override { return name.c_str(); }
    const wchar_t* getDefaultSearch() const override {
        return defaultSearch.empty() ? nullptr : defaultSearch.c_str();
    }

    std::wstring name = L"test";
    std::wstring defaultSearch;
};

} // namespace Mz::Test
