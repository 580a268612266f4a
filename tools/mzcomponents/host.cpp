#include "tools/mzcomponents/host.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/discovery.h"

#include <sstream>

namespace Mz::Commands {

namespace {

class BuilderCollector final : public QrEnumerator<QrCPtr<QrBuilderDescription>> {
  public:
    Action process(QrCPtr<QrBuilderDescription> builder) override {
        builders.push_back(std::move(builder));
        return Continue;
    }
    std::vector<QrCPtr<QrBuilderDescription>> builders;
};

class ExtensionCollector final : public QrEnumerator<const wchar_t*> {
  public:
    Action process(const wchar_t* extension) override {
        extensions.emplace_back(extension ? extension : L"");
        return Continue;
    }
    std::vector<std::wstring> extensions;
};

void giveToManager(const Tools::RecordedLibraries& libraries) {
    std::stringstream bytes;
    Tools::writeRecordedList(bytes, libraries);
    QrInBuffer buffer(&bytes);
    QrBinaryStream stream(&buffer);
    const auto companion =
        QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
    companion->read(stream);
}

} // namespace

Host::Host(const Common& common) {
    Tools::ScanOptions options;
    options.folders = Tools::foldersOf(Tools::pathOf(common.path));
    if (!common.cache.empty())
        options.list = Tools::pathOf(common.cache);
    options.probe.interrupted = [this] { return controller.isInterrupted(); };
    scanned = Tools::scan(options);
    if (scanned.interrupted)
        return;
    QrSetSystemProcessController(&controller);
    giveToManager(scanned.libraries);
    QrGetComponentManager()->initialize(Tools::searchPathOf(options.folders).c_str());
}

Host::~Host() {
    QrSetSystemProcessController(nullptr);
}

std::vector<QrCPtr<QrBuilderDescription>> Host::builders() const {
    BuilderCollector collector;
    QrGetComponentManager()->enumerateBuilders(collector);
    return std::move(collector.builders);
}

QrCPtr<QrImportBuilder> importBuilder(const QrBuilderDescription& description) {
    try {
        const QrCRefPtr<QrComponentBuilder> builder = description.getBuilder();
        return builder ? queryCast<QrImportBuilder>(const_cast<QrComponentBuilder*>(builder.get()))
                       : QrPtr<QrImportBuilder>();
    } catch (...) {
        return {}; // What another library throws when asked for its builder.
    }
}

std::vector<std::wstring> extensionsOf(const QrImportBuilder& builder) {
    ExtensionCollector collector;
    builder.enumerateExtensions(collector);
    return collector.extensions;
}

} // namespace Mz::Commands
