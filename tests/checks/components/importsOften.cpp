// SPDX-License-Identifier: BSL-1.0
/// Ends the process at its hundredth import, after all fixed inputs.
#include "tests/checks/components/broken.h"

#include <cstdlib>

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    using QrImportBuilder::import;
    Mz::QrRef<Mz::QrCastable> import(Mz::QrPtr<Mz::QrBufferedIO> io, const wchar_t* path,
                                     const wchar_t* hint) const override {
        if (++imports == 100)
            std::exit(7);
        return Importing::import(io, path, hint);
    }

  private:
    mutable int imports = 0;
};

MZ_BROKEN_BUILDER(Builder)
