// SPDX-License-Identifier: BSL-1.0
/// Goes on with an import that was interrupted.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::import;
    Mz::QrRef<Mz::QrCastable> import(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t* path,
                                     const wchar_t* hint) const override {
        for (int step = 0; step < 10; ++step)
            QrGetProcessController()->progress(static_cast<float>(step) / 10, L"Reading");
        return Importing::import(io, path, hint);
    }
};

MZ_BROKEN_BUILDER(Builder)
