// SPDX-License-Identifier: BSL-1.0
/// Accepts files and imports nothing, without a message.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::import;
    Mz::QrRef<Mz::QrCastable> import(Mz::QrPtr<Mz::QrBufferedIO>, const wchar_t*,
                                     const wchar_t*) const override {
        return nullptr;
    }
};

MZ_BROKEN_BUILDER(Builder)
