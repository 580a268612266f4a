/// The component manager of this process, started without risk.
#pragma once

#include "tools/mzcomponents/commands.h"

#include "components/componentManager/componentImp.h"
#include "components/componentManager/importBuilder.h"
#include "components/componentManager/importer.h"

#include <string>
#include <vector>

namespace Mz::Commands {

/// Scans the search path in processes of their own, brings the list up to date where there is one,
/// and initialises the manager with the result: libraries that failed are not loaded.
///
/// Lasts as long as the command; there can be only one.
class Host {
  public:
    explicit Host(const Common& common);
    ~Host();
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    /// Whether the user stopped it.
    bool interrupted() const { return scanned.interrupted; }
    const Tools::RecordedLibraries& libraries() const { return scanned.libraries; }
    Tools::ConsoleController& console() { return controller; }

    /// Every builder known.
    std::vector<QrCPtr<QrBuilderDescription>> builders() const;

  private:
    Tools::ConsoleController controller;
    Tools::ScanResult scanned;
};

/// The builder as an import builder; null when it is none or cannot be had.
QrCPtr<QrImportBuilder> importBuilder(const QrBuilderDescription& builder);

/// The extensions that it reads.
std::vector<std::wstring> extensionsOf(const QrImportBuilder& builder);

} // namespace Mz::Commands
