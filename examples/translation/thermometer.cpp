// SPDX-License-Identifier: BSL-1.0
/// The component: a thermometer that knows nothing of `Fahrenheit`.
#include "components/componentKit/componentKit.h"
#include "temperature.h"

using namespace Mz;

class Thermometer final : public Kit::Object<Thermometer, Celsius> {
  public:
    int degreesCelsius() const override { return 20; }
};

MZ_COMPONENT(L"Thermometer", L"Measures in degrees Celsius",
             Kit::builderOf<Thermometer>({.uid = thermometerUid, .name = L"thermometer"}))
