// SPDX-License-Identifier: BSL-1.0
/// The host: its code wants `Fahrenheit`, and the component's object does not support it. A
/// translator supplies the interface, without a change of the component or of the code that casts.
#include "components/componentKit/hostKit.h"
#include "temperature.h"

#include <iostream>

using namespace Mz;

namespace {

/// The translator of one thermometer.
class InFahrenheit final : public QrCastImpl<InFahrenheit, Fahrenheit> {
  public:
    explicit InFahrenheit(const Celsius& measured) : thermometer(measured) {}
    int degreesFahrenheit() const override { return thermometer.degreesCelsius() * 9 / 5 + 32; }

  private:
    const Celsius& thermometer;
};

/// Code that knows neither thermometers nor translators.
void show(QrCastable& object) {
    if (const auto fahrenheit = queryCast<Fahrenheit>(&object))
        std::cout << fahrenheit->degreesFahrenheit() << " degrees Fahrenheit\n";
    else
        std::cout << "no degrees Fahrenheit\n";
}

} // namespace

int main() {
    const auto folder = Kit::initialize(Kit::programFolder() / "components");
    const auto thermometer = Kit::create<Celsius>(thermometerUid);
    if (!thermometer) {
        std::cerr << "no thermometer was found in " << utf8Name(folder) << '\n';
        return 1;
    }
    show(*thermometer);
    {
        InFahrenheit translator(*thermometer);
        const Kit::Translation<Fahrenheit> translation(*thermometer, translator);
        show(*thermometer);
    }
    show(*thermometer);
}
