// SPDX-License-Identifier: BSL-1.0
// Calls `exit` at the place that an environment variable names.
#include "tests/faults/components/exiting.h"

#include "components/componentKit/componentKit.h"
#include "components/componentManager/persistant.h"

#include <chrono>
#include <cstdlib>
#include <string_view>
#include <thread>

using namespace Mz;
using namespace Mz::Test;

namespace {

bool isPlace(std::string_view place) {
    const char* const wanted = std::getenv(exitPlace);
    return wanted && place == wanted;
}

void exitAt(std::string_view place) {
    if (isPlace(place))
        std::exit(exitStatus); // NOLINT(concurrency-mt-unsafe)
}

/// Runs when the library is loaded. None does when it is unloaded: another call of `exit` while the
/// process ends is undefined.
struct Presence {
    Presence() { exitAt("initialiser"); }
} presence;

class Exiting final : public Kit::Object<Exiting, PlainObject, QrPersistant> {
  public:
    Exiting() { QrAddTranslation(getCastable(), getCastable(), accepts); }
    ~Exiting() override {
        QrRemoveTranslation(getCastable(), getCastable());
        exitAt("destructor");
    }
    const char* maker() const override { return "exiting"; }
    const QrUid* getClassUid() const override { return &exitingUid; }
    unsigned int getVersion() const override { return 1; }
    void write(QrStream&) override { exitAt("write"); }
    void read(QrStream&) override { exitAt("read"); }

  private:
    static bool accepts(const QrUid& uid) {
        if (uid == exitingImporterUid)
            exitAt("translator");
        return false;
    }
};

class ExitingBuilder final
    : public QrCastRef<QrCastHeap<QrCastImpl<ExitingBuilder, QrComponentBuilder>>> {
  public:
    QrRef<QrCastable> createObject() override {
        exitAt("createObject");
        if (isPlace("thread"))
            std::thread([] {
                // The end of the process unloads this library, which the other thread must no
                // longer run by then: it is in `join`, in the library of the system.
                std::this_thread::sleep_for(std::chrono::milliseconds(300));
                exitAt("thread");
            }).join();
        return QrRef<QrCastable>((new Exiting)->getCastable());
    }
};

class Importer final : public Kit::ImportBuilder<Importer> {
  public:
    Importer()
        : ImportBuilder({.uid = Kit::BuilderUid::atRunTime(exitingImporterUid)}, {L"exit"}) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        exitAt("canImport");
        return true;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        exitAt("import");
        return nullptr;
    }
};

class Description final : public PlainDescription {
  public:
    Description()
        : PlainDescription("exiting", {{exitingUid, L"exiting"}, {exitingImporterUid, L"exit"}}) {}

    QrRef<QrCastable> createBuilder(const QrUid& uid) override {
        exitAt("createBuilder");
        if (uid == exitingImporterUid)
            return QrRef<QrCastable>((new Importer)->getCastable());
        return QrRef<QrCastable>((new ExitingBuilder)->getCastable());
    }
    const wchar_t* getComponentLabel() override {
        exitAt("label");
        return PlainDescription::getComponentLabel();
    }
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        exitAt("enumerate");
        return PlainDescription::enumerateBuilders(e);
    }
};

} // namespace

extern "C" MZ_EXPORT QrCastable* QrGetComponentDescription() {
    exitAt("entry point");
    static Description description;
    return &description;
}
