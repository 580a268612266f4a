// SPDX-License-Identifier: BSL-1.0
/// An importer that throws an exception of an unknown type in enumerateExtensions. Its label
/// contains control characters for terminals.
#include "components/componentKit/componentKit.h"
#include "tests/components/testUids.h"

using namespace Mz;

namespace {

struct Unknown {};

class Importer final : public Kit::ImportBuilder<Importer> {
  public:
    Importer()
        : ImportBuilder({.uid = Test::testUid(0x30021),
                         .name = L"silent",
                         .label = L"\x1B[31mred\nsecond line"},
                        {}) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>&) const override {
        throw Unknown();
    }
    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return false;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return nullptr;
    }
};

} // namespace

MZ_COMPONENT(L"Throws", L"Throws in enumerateExtensions", Kit::builder<Importer>())
