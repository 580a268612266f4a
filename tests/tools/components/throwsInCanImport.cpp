// SPDX-License-Identifier: BSL-1.0
/// An importer that throws an exception of an unknown type in canImport.
#include "components/componentKit/componentKit.h"
#include "tests/components/testUids.h"

using namespace Mz;

namespace {

struct Unknown {};

class Importer final : public Kit::ImportBuilder<Importer> {
  public:
    Importer()
        : ImportBuilder({.uid = Test::testUid(0x30020), .name = L"a thrower", .label = L"Thrower"},
                        {L"note"}) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        throw Unknown();
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return nullptr;
    }
};

} // namespace

MZ_COMPONENT(L"Throws", L"Throws in canImport", Kit::builder<Importer>())
