// SPDX-License-Identifier: BSL-1.0
/// Imports objects that keep the input.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::import;
    Mz::QrRef<Mz::QrCastable> import(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t* path,
                                     const wchar_t* hint) const override {
        kept = io;
        return Importing::import(io, path, hint);
    }

  private:
    mutable Mz::QrPtr<Mz::QrBufferedIO> kept;
};

MZ_BROKEN_BUILDER(Builder)
