// SPDX-License-Identifier: BSL-1.0
// Defines the object in a separate library, as `peer.cpp` does.
#include "qtTypes.h"

QtGauge::~QtGauge() = default;
QtAbsent::~QtAbsent() = default;

namespace {

class SomeQtGauge final : public QObject, public QtGauge {
    Q_OBJECT
    Q_INTERFACES(QtGauge)

  public:
    long value() const override { return 1; }
};

} // namespace

QObject* newQtGauge() {
    return new SomeQtGauge;
}

#include "qtTypes.moc"
