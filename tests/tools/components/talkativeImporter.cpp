// SPDX-License-Identifier: BSL-1.0
/// An importer that writes to standard output when it is created and when it is queried.
#include "components/componentKit/componentKit.h"
#include "tests/components/testUids.h"

#include <cstdio>
#include <iostream>

using namespace Mz;

namespace {

void talk() {
    std::cout << "this is no result" << std::endl;
    std::puts("{\"neither\": \"is this\"");
    std::fflush(stdout);
}

class Importer final : public Kit::ImportBuilder<Importer> {
  public:
    Importer()
        : ImportBuilder({.uid = Test::testUid(0x30022), .name = L"talks", .label = L"Talks"},
                        {L"talk"}) {
        talk();
    }

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>& e) const override {
        talk();
        return ImportBuilder::enumerateExtensions(e);
    }
    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        talk();
        return false;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return nullptr;
    }
};

} // namespace

MZ_COMPONENT(L"Talks", L"Talks on standard output", Kit::builder<Importer>())
