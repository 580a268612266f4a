// SPDX-License-Identifier: BSL-1.0
/// A plug-in with two builders.
#include "components/componentKit/componentKit.h"

using namespace Mz;

namespace {

class Shape : public QrCastable {
  public:
    using Self = Shape;
    static constexpr QrUid uid = "1F60D301-7A60-11EF-8C2B-94A7E5D0316B"_uid;
};

class Circle final : public Kit::Object<Circle, Shape> {};
class Ring final : public Kit::Object<Ring, Shape> {};

} // namespace

MZ_COMPONENT(L"Shapes", L"Simple shapes for drawings",
             Kit::builderOf<Circle>({.uid = "1F60D302-7A60-11EF-8C2B-94A7E5D0316B"_uid,
                                     .name = L"shape",
                                     .label = L"Circle"}),
             Kit::builderOf<Ring>({.uid = "1F60D303-7A60-11EF-8C2B-94A7E5D0316B"_uid,
                                   .name = L"shape",
                                   .label = L"Ring",
                                   .text = L"with an adjustable hole"}))
