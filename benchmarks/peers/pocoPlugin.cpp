// SPDX-License-Identifier: BSL-1.0
/// An ordinary small plug-in library for POCO. The benchmarks make many copies of it.
#include "dllPart.h"

#include <Poco/ClassLibrary.h>

class PocoPart final : public DllPart {
  public:
    long value() const override { return 1; }
};

POCO_BEGIN_MANIFEST(DllPart)
POCO_EXPORT_CLASS(PocoPart)
POCO_END_MANIFEST
