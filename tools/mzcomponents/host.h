// SPDX-License-Identifier: BSL-1.0
/// The component manager of this process, started without risk.
#pragma once

#include "tools/mzcomponents/commands.h"

#include "components/componentManager/componentImp.h"
#include "components/componentManager/importBuilder.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/processControl.h"

#include <string>
#include <vector>

namespace Mz::Commands {

/// Scans the search path in processes of their own, brings the list up to date where there is one,
/// and initialises the manager with the result: libraries that failed are not loaded, and neither
/// is what could not be looked at in such a process. Faults are said on standard error.
///
/// From then on standard output belongs to the results. Lasts as long as the command; there can be
/// only one.
class Host {
  public:
    Host(const Common& common, const ProbeArguments& probe);
    ~Host();
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    /// Whether the user stopped it.
    bool interrupted() const { return scanned.interrupted; }
    /// The exit status where nothing else is wrong: whether all that should be here is.
    int status() const { return complete ? good : subjectIsWrong; }
    const Tools::RecordedLibraries& libraries() const { return scanned.libraries; }
    Tools::ConsoleController& console() { return controller; }

    /// Every builder known.
    std::vector<QrCPtr<QrBuilderDescription>> builders() const;

  private:
    void tellFaults(const std::string& cache);
    std::vector<std::filesystem::path> safeOnes(std::vector<std::filesystem::path> folders);
    void start(const std::vector<std::filesystem::path>& folders);

    Tools::ConsoleController controller;
    QrProcessControl* previous = nullptr; ///< the process's controller before this one
    bool installed = false;
    Tools::ScanResult scanned;
    bool complete = true;
};

/// The builder as an import builder; null when it is none or cannot be had.
QrCPtr<QrImportBuilder> importBuilder(const QrBuilderDescription& builder);

/// The extensions that it reads; none when it throws.
std::vector<std::wstring> extensionsOf(const QrImportBuilder& builder);

} // namespace Mz::Commands
