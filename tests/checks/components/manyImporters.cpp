// SPDX-License-Identifier: BSL-1.0
/// Has an import builder for each of several faults that do not hide one another.
#include "tests/checks/components/broken.h"

#include <filesystem>

using namespace Mz;
using Test::testUid;

namespace {

/// An import builder that accepts everything and imports an object.
template <class Impl>
class Accepting : public Kit::ImportBuilder<Impl> {
  public:
    using Kit::ImportBuilder<Impl>::ImportBuilder;
    using QrImportBuilder::canImport;
    using QrImportBuilder::import;
    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return true;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return (new Test::NamedObject("importer"))->getCastable();
    }
};

class Nameless final : public Accepting<Nameless> {
  public:
    Nameless()
        : Accepting({.uid = testUid(0x5E20), .name = L"nameless", .label = L"Nameless"},
                    {nullptr, L"good", L""}) {}
};

/// Leaves the working folder, at its first file.
class Wandering final : public Accepting<Wandering> {
  public:
    Wandering()
        : Accepting({.uid = testUid(0x5E21), .name = L"wandering", .label = L"Wandering"},
                    {L"far"}) {}
    using Accepting::canImport;
    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        std::filesystem::current_path(std::filesystem::current_path().root_path());
        return true;
    }
};

/// Goes on after each warning, whatever the user wants.
class Warning final : public Accepting<Warning> {
  public:
    Warning()
        : Accepting({.uid = testUid(0x5E22), .name = L"warning", .label = L"Warning"}, {L"bad"}) {}
    using Accepting::import;
    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                             const wchar_t* hint) const override {
        for (int line = 1; line <= 10; ++line)
            QrGetProcessController()->warning(line, L"A strange line");
        return Accepting::import(io, path, hint);
    }
};

} // namespace

MZ_COMPONENT(L"Many importers", L"Breaks many rules of imports", Kit::builder<Nameless>(),
             Kit::builder<Wandering>(), Kit::builder<Warning>())
