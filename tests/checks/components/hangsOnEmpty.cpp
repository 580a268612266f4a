// SPDX-License-Identifier: BSL-1.0
/// Does not return from canImport if the file is empty.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::canImport;
    bool canImport(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        while (io->read() < 0)
            continue;
        return false;
    }
};

MZ_BROKEN_BUILDER(Builder)
