// SPDX-License-Identifier: BSL-1.0
/// Reports progress in percent.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::import;
    Mz::QrRef<Mz::QrCastable> import(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t* path,
                                     const wchar_t* hint) const override {
        QrGetProcessController()->progress(50.0F, L"Half of it");
        return Importing::import(io, path, hint);
    }
};

MZ_BROKEN_BUILDER(Builder)
