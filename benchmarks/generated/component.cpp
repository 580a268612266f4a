// SPDX-License-Identifier: BSL-1.0
/// An ordinary small component library. The benchmarks make many copies of it.
#include "identity.h"

#include "components/componentKit/componentKit.h"

namespace Mz::Benchmarks {

namespace {

class Part : public QrCastable {
  public:
    using Self = Part;
    static constexpr QrUid uid{0x7B3C1E03, 0x53A011EF, 0x8D4E20C9, 0x6F10B277};

    virtual long value() const = 0;
};

class SomePart final : public QrCastRef<QrCastHeap<QrCastImpl<SomePart, Part>>> {
  public:
    long value() const override { return 1; }
};

} // namespace

} // namespace Mz::Benchmarks

MZ_COMPONENT(L"Generated", L"One of many component libraries",
             Mz::Kit::builderOf<Mz::Benchmarks::SomePart>(
                 {.uid = Mz::Kit::BuilderUid::atRunTime(Mz::Benchmarks::ownUid),
                  .name = L"generated part"}))
