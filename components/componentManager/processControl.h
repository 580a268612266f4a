// SPDX-License-Identifier: BSL-1.0
/// How long-running work reports to the user: messages, progress, abort and file lookup.
///
/// Long-running work, such as an import, has no user interface. It reports to the process
/// controller of its thread, which `QrGetProcessController()` returns. Hosts install their own
/// controllers. Without one, the default controller writes to the standard error stream, as a last
/// resort.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/export.h"

#include <string>

namespace Mz {

/// The receiver of messages and progress, which a host implements.
///
/// Every `text` is valid only during the call. `code` identifies the message: the reporter chooses
/// the number, and 0 means none.
///
/// Threads: the implementation decides whether several threads may use one controller at the same
/// time. If they may not, install one controller for each thread.
class MZ_COMPONENT_MANAGER_API QrProcessControl : public QrCastable {
  public:
    using Self = QrProcessControl;
    static constexpr QrUid uid{0xEB719621, 0xC02011D1, 0xAA7A00C0, 0x4FB1532A};

    ~QrProcessControl() override;

    /// Returns an opaque pointer of the host, or null. The default controller returns null.
    virtual void* getContext() = 0;

    /// Reports information.
    virtual void message(int code, const wchar_t* text) = 0;

    /// Returns whether the user interrupted the work. Long-running work calls this regularly and
    /// stops if it is true. The default controller returns false.
    virtual bool isInterrupted() = 0;

    /// Reports a problem that does not stop the work.
    ///
    /// \return whether to continue; the default controller returns true
    virtual bool warning(int code, const wchar_t* text) = 0;

    /// Returns whether progress is shown. If it is not, the work can omit its reports. The default
    /// controller returns false.
    virtual bool isProgressShown() = 0;

    /// Reports progress. The default controller writes the percentage, truncated to an integer.
    ///
    /// \param fraction  completed part of the work, from 0 to 1
    /// \return whether to continue; the default controller returns true
    virtual bool progress(float fraction, const wchar_t* text) = 0;

    /// Returns whether the status is shown. The default controller returns false.
    virtual bool isStatusShown() = 0;

    /// Reports the current activity.
    virtual void status(const wchar_t* text) = 0;

    /// Reports a failure.
    ///
    /// \return whether to continue despite it; the default controller returns false
    virtual bool error(int code, const wchar_t* text) = 0;

    /// Returns whether errors are shown. The default controller returns false.
    virtual bool isErrorShown() = 0;

    /// Writes an entry to the log. The default controller treats it like `message`.
    virtual void log(int code, const wchar_t* text) = 0;

    /// Reports the reason and aborts the work by an exception; never returns. The code that started
    /// the work catches the exception.
    ///
    /// \throws Assertions::ExProgramAborted  from the default controller; other controllers may
    ///         throw other exceptions
    [[noreturn]] virtual void abort(int code, const wchar_t* text) = 0;

    /// Returns the full name of an existing regular file, or an empty string if there is none. A
    /// missing file never throws.
    ///
    /// The default controller tries, in this order:
    /// 1. `fileName` in each directory of `searchPath`, joined by one '/'. It omits this step if
    ///    `fileName` begins with '/' or '\', or if its second character is ':'.
    /// 2. The same with `fallbackSearchPath`, unless it is null.
    /// 3. `fileName` unchanged.
    ///
    /// \param fileName            name to find; null counts as empty
    /// \param searchPath          directories, separated by ';', or null
    /// \param fallbackSearchPath  directories, separated by ';', or null
    virtual std::wstring findFile(const wchar_t* fileName, const wchar_t* searchPath,
                                  const wchar_t* fallbackSearchPath) = 0;

  private:
    virtual void forceVtblInstantiation();
};

} // namespace Mz

/// The five functions of the controller registry.
///
/// Ownership: the registry holds plain pointers. It takes no references, deletes nothing and checks
/// nothing. The host keeps each controller alive while it is installed. It removes the controller
/// of a thread before the thread ends; otherwise a later thread with the same system identifier
/// inherits it.
///
/// Threads: all five functions are thread-safe. They work during the construction and destruction
/// of static objects. None of them reports an error.
extern "C" {

/// Returns the controller of the calling thread, or the system-wide controller if the thread has
/// none. The result is null only if the host set the system-wide controller to null. No reference
/// is taken.
MZ_COMPONENT_MANAGER_API Mz::QrProcessControl* QrGetProcessController();

/// Returns the system-wide controller. It is the default controller until the host replaces it. No
/// reference is taken.
MZ_COMPONENT_MANAGER_API Mz::QrProcessControl* QrGetSystemProcessController();

/// Replaces the system-wide controller.
///
/// \param controller  new controller, or null; stored without a check
MZ_COMPONENT_MANAGER_API void QrSetSystemProcessController(Mz::QrProcessControl* controller);

/// Returns the controller of the calling thread, or null if it has none. No reference is taken.
MZ_COMPONENT_MANAGER_API Mz::QrProcessControl* QrGetThreadProcessController();

/// Sets, replaces or removes the controller of the calling thread.
///
/// \param controller  new controller; null removes the present one
MZ_COMPONENT_MANAGER_API void QrSetThreadProcessController(Mz::QrProcessControl* controller);
}

namespace Mz {
using ::QrGetProcessController;
using ::QrGetSystemProcessController;
using ::QrGetThreadProcessController;
using ::QrSetSystemProcessController;
using ::QrSetThreadProcessController;
} // namespace Mz
