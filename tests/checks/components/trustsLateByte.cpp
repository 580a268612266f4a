// SPDX-License-Identifier: BSL-1.0
/// Crashes in import on input of three bytes that only many random inputs contain.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::import;
    Mz::QrRef<Mz::QrCastable> import(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t*,
                                     const wchar_t*) const override {
        const int first = io->read(), second = io->read();
        if (first == 'k' && second == 'm')
            Mz::Test::crash();
        return (new Mz::Test::Stored)->getCastable();
    }
};

MZ_BROKEN_BUILDER(Builder)
