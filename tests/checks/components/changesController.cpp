// SPDX-License-Identifier: BSL-1.0
/// Changes the process controller in canImport.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::canImport;
    bool canImport(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        QrSetThreadProcessController(nullptr);
        return io->read() >= 0;
    }
};

MZ_BROKEN_BUILDER(Builder)
