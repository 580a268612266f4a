// SPDX-License-Identifier: BSL-1.0
/// The start of a host in one call: reads the recorded list, scans what is new in child processes,
/// writes the list, and initialises the component manager. After a start that did not end cleanly
/// it offers to begin without the components that may be the reason: the safe mode.
///
///     int main() {
///         const Mz::Kit::Started started = Mz::Kit::start("components.list", "components");
///         ...
///     } // The end of `started` is the clean end.
///
/// \since 0.2
#pragma once

#include "components/componentTools/export.h"
#include "components/componentTools/probe.h"
#include "components/componentTools/scan.h"

#include "components/componentManager/processControl.h"
#include "components/componentManager/uid.h"

#include <filesystem>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace Mz::Kit {

/// Which components a start uses.
enum class StartMode {
    asAlways,          ///< all
    withoutChanged,    ///< all but those that changed last
    withoutThirdParty, ///< those of the host itself
};

/// Names a component library, by its file or by one of its builders.
class ComponentName {
  public:
    /// The name of its file, with or without the extension, in any letter case.
    ComponentName(const wchar_t* name) : fileName(name) {}
    /// The name of its file, with or without the extension, in any letter case.
    ComponentName(std::wstring name) : fileName(std::move(name)) {}
    /// The uid of one of its builders.
    ComponentName(const QrUid& uid) : builder(uid) {}

    /// The name of the file; empty if it is named by a builder.
    const std::wstring& name() const { return fileName; }
    /// The uid of the builder, if it is named by one.
    const std::optional<QrUid>& uid() const { return builder; }

  private:
    std::wstring fileName;
    std::optional<QrUid> builder;
};

/// An earlier start that did not end cleanly: its process crashed or was killed, or called `exit`
/// before its `Started` object was destroyed.
struct UncleanEnd {
    /// Whether the process ended while its component manager was initialised.
    bool whileStarting = false;
    /// The components that `StartMode::withoutChanged` leaves out: those that are new or changed
    /// since the start before, else those that changed at an earlier start.
    std::vector<std::filesystem::path> changed;
    /// The components that `StartMode::withoutThirdParty` leaves out.
    std::vector<std::filesystem::path> thirdParty;
};

/// The options of `start`.
struct StartOptions {
    /// The recorded list to update. Beside it are the files `LIST.verdicts.json`,
    /// `LIST.starts.json` and, while the host runs, `LIST.running-` with a number.
    std::filesystem::path list;
    /// The folders to search, separated by ';'.
    std::filesystem::path searchPath;
    /// Components to leave out in this start only. A name that no component has is ignored.
    std::vector<ComponentName> without;
    /// Returns whether a component is the host's own, by its full path. If empty, these are the
    /// components in the program's folder and the folders below it.
    std::function<bool(const std::filesystem::path&)> isOwn;
    /// Chooses the mode after an unclean end, for example by a question; may be empty. The default
    /// is `StartMode::asAlways`.
    std::function<StartMode(const UncleanEnd&)> afterUncleanEnd;
    /// The limits of the scan. If `interrupted` returns true, the start is stopped.
    Tools::ProbeOptions probe;
    /// Receives the progress of the scan; may be null. The caller owns it.
    QrProcessControl* controller = nullptr;
};

/// A host that has started. While this object exists, a mark beside the list shows that the host
/// works. Keep it until the host no longer uses components, usually to the end of `main`.
///
/// Movable. A moved-from object may only be destroyed or assigned to.
class MZ_COMPONENT_TOOLS_API Started {
  public:
    /// Removes the mark: this is the clean end, also if an exception ends the block.
    ~Started();
    Started(Started&&) noexcept;
    Started& operator=(Started&&) noexcept;

    /// Returns whether the component manager was initialised by this start.
    explicit operator bool() const;
    /// Returns why it was not, or what could not be written, as a sentence; empty if all is well.
    const std::wstring& problem() const;
    /// Returns the mode of this start.
    StartMode mode() const;
    /// Returns the unclean end before this start, if there was one.
    const std::optional<UncleanEnd>& uncleanEnd() const;
    /// Returns the components that this start left out, other than those that the user switched
    /// off.
    const std::vector<std::filesystem::path>& leftOut() const;
    /// Returns the result of the scan.
    const Tools::ScanResult& scanned() const;

    /// Removes the mark before the end of this object. Call it before code that may end the process
    /// without destroying the object.
    void finish();

  private:
    friend class Starter;
    struct State;
    explicit Started(std::unique_ptr<State> state);
    std::unique_ptr<State> state;
};

/// Starts the components. Call it once, in place of `QrComponentManager::initialize`.
///
/// New and changed libraries are loaded in child processes first (`Tools::scan`). Those that fail,
/// and those that the user switched off (`Tools::disableComponent`), are not loaded into this
/// process. A library that cannot be tried is loaded, as without a scan: it needs the program of
/// its host, or the child process cannot be started.
///
/// Components that are left out by `without` or by the mode are left out in this start only. The
/// list does not change by it.
///
/// Several processes may use one list at once. A process that still runs is no unclean end.
///
/// \return the started host, in any case; see `Started::problem`
/// \throws std::bad_alloc if memory runs out
/// \throws std::system_error if the program's folder is needed and not known
/// \throws whatever the functions in `options` throw
[[nodiscard]] MZ_COMPONENT_TOOLS_API Started start(const StartOptions& options);

/// Starts the components with the default options.
/// \param list        the recorded list to update
/// \param searchPath  the folders to search, separated by ';'
/// \return and \throws as the other overload
[[nodiscard]] MZ_COMPONENT_TOOLS_API Started start(const std::filesystem::path& list,
                                                   const std::filesystem::path& searchPath);

/// Starts all components but some.
///
///     auto started = Mz::Kit::startWithout({L"mesh", slowBuilderUid}, list, folder);
///
/// \param without     the components to leave out in this start
/// \param list        the recorded list to update
/// \param searchPath  the folders to search, separated by ';'
/// \return and \throws as `start`
[[nodiscard]] MZ_COMPONENT_TOOLS_API Started startWithout(std::vector<ComponentName> without,
                                                          const std::filesystem::path& list,
                                                          const std::filesystem::path& searchPath);

} // namespace Mz::Kit
