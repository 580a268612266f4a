// SPDX-License-Identifier: BSL-1.0
/// Starts the component manager of this process with safe libraries only.
#pragma once

#include "tools/mzcomponents/commands.h"

#include "components/componentManager/componentImp.h"
#include "components/componentManager/importBuilder.h"
#include "components/componentManager/importer.h"
#include "components/componentManager/processControl.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Commands {

/// The component manager for one command.
///
/// The constructor scans the search path in child processes, updates the recorded list, if there is
/// one, and initialises the manager with the result. Libraries that failed, or that could not be
/// tried, are not loaded. Faults are reported on standard error.
///
/// From the construction on, standard output is reserved for results. Only one object may be
/// created in a process; it lives as long as the command.
class Host {
  public:
    Host(const Common& common, const ProbeArguments& probe);
    ~Host();
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    /// Returns whether the user stopped the scan. The manager is then not initialised.
    bool interrupted() const { return scanned.interrupted; }
    /// Returns `exitSuccess` if no fault was reported, else `exitFailure`.
    int status() const { return complete ? exitSuccess : exitFailure; }
    const Tools::RecordedLibraries& libraries() const { return scanned.libraries; }
    Tools::ConsoleController& console() { return controller; }

    /// Returns the descriptions of all registered builders.
    std::vector<QrCPtr<QrBuilderDescription>> builders() const;

  private:
    void reportFaults(const std::string& cache);
    std::vector<std::filesystem::path> safeFolders(std::vector<std::filesystem::path> folders);
    void start(const std::vector<std::filesystem::path>& folders);

    Tools::ConsoleController controller;
    QrProcessControl* previous = nullptr; ///< the process's controller before this one
    bool installed = false;
    Tools::ScanResult scanned;
    bool complete = true;
};

/// Returns the builder as an import builder; null if it is not one, or getting it throws.
QrCPtr<QrImportBuilder> importBuilder(const QrBuilderDescription& builder);

/// Returns the file extensions of an import builder; empty if it throws.
std::vector<std::wstring> extensionsOf(const QrImportBuilder& builder);

} // namespace Mz::Commands
