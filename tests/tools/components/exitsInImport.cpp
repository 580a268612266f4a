// SPDX-License-Identifier: BSL-1.0
/// Ends the process with status 0 when it imports a file or creates an object.
#include "components/componentKit/componentKit.h"
#include "tests/components/testUids.h"

#include <cstdlib>

using namespace Mz;

namespace {

class Importer final : public Kit::ImportBuilder<Importer> {
  public:
    Importer()
        : ImportBuilder({.uid = Test::testUid(0x30023), .name = L"exits", .label = L"Exits"},
                        {L"exit"}) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        return io->read() == 'E';
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        std::exit(0);
    }
    QrRef<QrCastable> createObject() override { std::exit(0); }
};

} // namespace

MZ_COMPONENT(L"Exits", L"Exits where it should import", Kit::builder<Importer>())
