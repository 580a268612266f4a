// SPDX-License-Identifier: BSL-1.0
/// The interface and the object of the casts with Qt, in a library of their own, and the interface
/// of the plug-ins.
#pragma once

#include <QObject>
#include <QtPlugin>

class QtGauge {
  public:
    virtual ~QtGauge();
    virtual long value() const = 0;
};
Q_DECLARE_INTERFACE(QtGauge, "mz.benchmarks.Gauge")

/// An interface that no object has.
class QtAbsent {
  public:
    virtual ~QtAbsent();
};
Q_DECLARE_INTERFACE(QtAbsent, "mz.benchmarks.Absent")

/// Returns a new object with the interface `QtGauge`. The caller owns it.
Q_DECL_EXPORT QObject* newQtGauge();
