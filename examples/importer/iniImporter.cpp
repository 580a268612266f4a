// SPDX-License-Identifier: BSL-1.0
/// The component: an import builder for .ini files. Exceptions of the format end here, because the
/// importer, in another library, does not know them. They become an error of the process controller
/// and a null result.
#include "iniFormat.h"

#include "components/componentKit/componentKit.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/processControl.h"

#include <exception>
#include <utility>

using namespace Mz;

namespace {

class ReadSettings final : public Kit::Object<ReadSettings, Settings> {
  public:
    explicit ReadSettings(std::vector<Entry> read) : all(std::move(read)) {}
    const std::vector<Entry>& entries() const override { return all; }

  private:
    std::vector<Entry> all;
};

void reportError(const wchar_t* path, const char* reason) {
    if (QrProcessControl* const controller = QrGetProcessController())
        controller->error(0,
                          (std::wstring(textOrEmpty(path)) + L": " + displayText(reason)).c_str());
}

class IniImporter final : public Kit::ImportBuilder<IniImporter> {
  public:
    static constexpr QrUid builderUid = "8C2F4E02-7A31-11EF-B6D0-1F93C5A0E274"_uid;

    IniImporter()
        : ImportBuilder({.uid = builderUid, .name = SETTINGS_BUILDERS, .label = L"INI files"},
                        {L"ini", L"cfg"}) {}

    using ImportBuilder::canImport;
    using ImportBuilder::import;

    bool canImport(QrPtr<QrBufferedIO> io, const wchar_t*, const wchar_t*) const override {
        return looksLikeIni(*io);
    }

    QrRef<QrCastable> import(QrPtr<QrBufferedIO> io, const wchar_t* path,
                             const wchar_t*) const override {
        try {
            return new ReadSettings(readIni(*io));
        } catch (const std::exception& failure) { // of the format, the stream or the memory
            reportError(path, failure.what());
            return nullptr;
        }
    }
};

} // namespace

MZ_COMPONENT(L"Settings", L"Reads settings from .ini files", Kit::builder<IniImporter>())
