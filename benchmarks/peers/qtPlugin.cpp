// SPDX-License-Identifier: BSL-1.0
/// An ordinary small plug-in library for Qt. The benchmarks make many copies of it.
#include <QObject>
#include <QtPlugin>

class QtPlugin final : public QObject {
    Q_OBJECT
    Q_PLUGIN_METADATA(IID "mz.benchmarks.Plugin")

  public:
    long value() const { return 1; }
};

#include "qtPlugin.moc"
