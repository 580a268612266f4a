// SPDX-License-Identifier: BSL-1.0
/// Crashes in canImport on a file of another format.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::canImport;
    bool canImport(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        return io->read() == 0x89 && io->read() == 'P' && Mz::Test::crash() != 0;
    }
};

MZ_BROKEN_BUILDER(Builder)
