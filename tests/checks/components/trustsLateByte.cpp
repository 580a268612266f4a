// SPDX-License-Identifier: BSL-1.0
/// Crashes in import on a first byte that none of the fixed inputs has.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::import;
    Mz::QrRef<Mz::QrCastable> import(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t*,
                                     const wchar_t*) const override {
        if (io->read() == 0xB7)
            Mz::Test::crash();
        return (new Mz::Test::Stored)->getCastable();
    }
};

MZ_BROKEN_BUILDER(Builder)
