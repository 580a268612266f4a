// SPDX-License-Identifier: BSL-1.0
/// A component with two import builders that obey scripts, and a family of odd builders.
#include "tests/kit/scriptBuilder.h"

using namespace Mz;
using namespace Mz::Test;

namespace {

/// Is registered like an import builder, and is none.
class Plain final : public Kit::Builder<Plain> {
  public:
    Plain() : Builder({.uid = plainUid, .name = L"odd", .label = L"Plain"}) {}
    QrRef<QrCastable> createObject() override { return nullptr; }
};

/// Fails to list its extensions.
class Listless final : public Kit::Builder<Listless, QrImportBuilder> {
  public:
    Listless() : Builder({.uid = listlessUid, .name = L"odd", .label = L""}) {}

    using QrImportBuilder::canImport;
    using QrImportBuilder::import;

    QrEnum::Action enumerateExtensions(QrEnumerator<const wchar_t*>&) const override {
        return QrEnum::Fail;
    }
    bool canImport(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return true;
    }
    QrRef<QrCastable> import(QrPtr<QrBufferedIO>, const wchar_t*, const wchar_t*) const override {
        return nullptr;
    }
    QrRef<QrCastable> createObject() override { return nullptr; }
};

} // namespace

MZ_COMPONENT(L"Script importers", L"For the tests of the kit",
             Kit::builder<ScriptBuilder>(
                 Kit::BuilderInfo{.uid = alphaUid, .name = L"script", .label = L"Alpha"}, 'A',
                 L"a"),
             Kit::builder<ScriptBuilder>(
                 Kit::BuilderInfo{.uid = betaUid, .name = L"script", .label = L"Beta"}, 'B', L"b"),
             Kit::builder<Plain>(), Kit::builder<Listless>(),
             Kit::builder<ScriptBuilder>(
                 Kit::BuilderInfo{.uid = deltaUid, .name = L"odd", .label = L"Delta"}, 'D', L"d"))
