// SPDX-License-Identifier: BSL-1.0
/// Has an import builder without a description.
#include "tests/checks/components/broken.h"

using namespace Mz;

class Builder final
    : public QrCastRef<QrCastHeap<QrCastMulti<Builder, QrComponentBuilder, QrImportBuilder>>> {
  public:
    using QrImportBuilder::canImport;
    using QrImportBuilder::import;
    QrRef<QrCastable> createObject() override { return nullptr; }
    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>& e) const override {
        const QrEnum::Action action = e.process(L"broken");
        return action ? action : e.finished();
    }
    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return false;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return nullptr;
    }
};

using Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrRef<QrCastable> createBuilder(const QrUid& uid) override {
        if (!(uid == Test::brokenUid))
            return nullptr;
        return (new Builder)->getCastable();
    }
};

MZ_BROKEN_DESCRIPTION(Description)
