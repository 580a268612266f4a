// SPDX-License-Identifier: BSL-1.0
/// Makes objects whose interfaces have different principal objects.
#include "tests/checks/components/broken.h"

using namespace Mz;

class Object final
    : public QrCastRef<QrCastHeap<QrCastMulti<Object, Test::PlainObject, QrPersistant>>> {
  public:
    const char* maker() const override { return "broken"; }
    const QrUid* getClassUid() const override { return &Test::brokenUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream&) override {}
    void read(QrStream&) override {}
    // The const form says something else.
    const QrCastable* getCastable() const override {
        return static_cast<const QrPersistant*>(this);
    }
    QrCastable* getCastable() override { return static_cast<Test::PlainObject*>(this); }
};

MZ_BROKEN_OBJECT(Object)
