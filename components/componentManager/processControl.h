/// How long work talks to the user: messages, progress, abort, and the lookup of files.
///
/// Work that takes long (imports above all) asks `QrGetProcessController()` for the controller of
/// its thread and reports to it, instead of opening windows of its own. A host installs controllers
/// that speak its own language; without one the default controller serves, a last resort that
/// writes to the standard error stream.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/export.h"

#include <string>

namespace Mz {

/// What a host implements to hear of the work done in its name.
///
/// All texts are only looked at during the call. `code` is a number of the reporter's own choosing,
/// by which a host can tell its messages apart; 0 stands for none. Whether an operation may be
/// called from several threads at once is the controller's own affair: install one per thread where
/// it may not.
class MZ_COMPONENT_MANAGER_API QrProcessControl : public QrCastable {
  public:
    using Self = QrProcessControl;
    static constexpr QrUid uid{0xEB719621, 0xC02011D1, 0xAA7A00C0, 0x4FB1532A};

    ~QrProcessControl() override;

    /// An opaque pointer of the host's; null when it has none. The default controller's is null.
    virtual void* getContext() = 0;

    /// Says something worth knowing.
    virtual void message(int code, const wchar_t* text) = 0;

    /// Whether the user wants the work to stop. Ask now and then, and stop when it is true.
    virtual bool isInterrupted() = 0;

    /// Says that something is doubtful; true to go on. The default controller answers true.
    virtual bool warning(int code, const wchar_t* text) = 0;

    /// Whether anybody sees the progress, so that work can spare itself the reports.
    virtual bool isProgressShown() = 0;

    /// Reports progress: `fraction` of the whole, from 0 to 1, with a text; true to go on. The
    /// default controller shows the percentage cut to a whole number, and answers true.
    virtual bool progress(float fraction, const wchar_t* text) = 0;

    /// Whether anybody sees the status.
    virtual bool isStatusShown() = 0;

    /// Says what is being done at the moment.
    virtual void status(const wchar_t* text) = 0;

    /// Says that something failed; true to go on all the same. The default controller answers
    /// false.
    virtual bool error(int code, const wchar_t* text) = 0;

    /// Whether anybody sees errors.
    virtual bool isErrorShown() = 0;

    /// Notes something for later.
    virtual void log(int code, const wchar_t* text) = 0;

    /// Gives the work up: says why, then leaves by an exception, which the starter of the work
    /// catches. The default controller throws `Assertions::ExProgramAborted`.
    [[noreturn]] virtual void abort(int code, const wchar_t* text) = 0;

    /// The full name of an existing regular file, or an empty string; never throws for a missing
    /// one. Null texts count as empty.
    ///
    /// The default controller looks for `fileName` in each directory of `searchPath` (separated by
    /// ';', in order), joined by one '/'; a name that begins with '/' or '\', or whose second
    /// character is ':', skips that. Then it asks itself again with `fallbackSearchPath`, when
    /// there is one, and at the very end takes `fileName` as it stands.
    virtual std::wstring findFile(const wchar_t* fileName, const wchar_t* searchPath,
                                  const wchar_t* fallbackSearchPath) = 0;

  private:
    virtual void forceVtblInstantiation();
};

} // namespace Mz

/// The five functions of the controller registry.
///
/// The registry holds plain pointers: it takes no references, deletes nothing and checks nothing.
/// The host keeps each controller alive for as long as it is installed, and takes a thread's
/// controller out before the thread ends: otherwise a later thread with the same identifier of the
/// system inherits it.
///
/// Any thread may call any of them at any time, during the construction and destruction of static
/// objects too. None of them reports an error.
extern "C" {

/// The controller of the calling thread if it has one, else the system-wide controller. Null only
/// when the host made the latter null.
MZ_COMPONENT_MANAGER_API Mz::QrProcessControl* QrGetProcessController();

/// The system-wide controller: the default controller, until the host replaces it.
MZ_COMPONENT_MANAGER_API Mz::QrProcessControl* QrGetSystemProcessController();

/// Replaces the system-wide controller. Anything is taken as it is, null included.
MZ_COMPONENT_MANAGER_API void QrSetSystemProcessController(Mz::QrProcessControl* controller);

/// The calling thread's own controller, or null.
MZ_COMPONENT_MANAGER_API Mz::QrProcessControl* QrGetThreadProcessController();

/// Sets or replaces the calling thread's own controller; null takes it out.
MZ_COMPONENT_MANAGER_API void QrSetThreadProcessController(Mz::QrProcessControl* controller);
}

namespace Mz {
using ::QrGetProcessController;
using ::QrGetSystemProcessController;
using ::QrGetThreadProcessController;
using ::QrSetSystemProcessController;
using ::QrSetThreadProcessController;
} // namespace Mz
