// SPDX-License-Identifier: BSL-1.0
/// A process controller for hosts without a window.
#pragma once

#include "components/componentTools/export.h"

#include "components/componentManager/processControl.h"

#include <cstddef>
#include <iosfwd>
#include <string>

namespace Mz::Tools {

/// A process controller that writes messages as text to standard error, in the terminal's encoding.
///
/// Line ends and tabs of messages are kept; other control characters are written as `\xNN`. On a
/// terminal, progress is a bar that is redrawn on one line. Elsewhere it is one line for each tenth
/// of the work. Warnings, errors and aborts start with their kind, which is coloured on a terminal.
///
/// While a controller exists, the first Ctrl-C does not end the process. It makes `isInterrupted`
/// return true, and `warning` and `progress` return false, so that work stops at its next report.
/// `error` always returns false. A second Ctrl-C ends the process.
///
/// Lifetime: references are not counted. Install the controller with
/// `QrSetSystemProcessController`, or for one thread, and keep it alive while it is installed.
/// Threads: not thread-safe. Use, construct and destroy controllers in one thread at a time.
///
///     ConsoleController controller;
///     QrSetSystemProcessController(&controller);
class MZ_COMPONENT_TOOLS_API ConsoleController final
    : public QrCastImpl<ConsoleController, QrProcessControl> {
  public:
    /// Writes to `std::cerr`.
    ConsoleController();
    /// Writes to another stream.
    /// \param stream    must outlive the controller
    /// \param terminal  whether `stream` is a terminal
    ConsoleController(std::ostream& stream, bool terminal);
    ~ConsoleController() override;
    ConsoleController(const ConsoleController&) = delete;
    ConsoleController& operator=(const ConsoleController&) = delete;

    /// Returns null.
    void* getContext() override;
    void message(int code, const wchar_t* text) override;
    /// Returns whether Ctrl-C was pressed since the first of the existing controllers was created.
    bool isInterrupted() override;
    /// Returns false after Ctrl-C, else true.
    bool warning(int code, const wchar_t* text) override;
    /// Returns true, unless progress is hidden.
    bool isProgressShown() override;
    /// Shows progress, unless it is hidden.
    /// \param fraction  is clamped to 0 … 1; NaN counts as 0
    /// \param text      may be null
    /// \return false after Ctrl-C, else true
    bool progress(float fraction, const wchar_t* text) override;
    bool isStatusShown() override;
    void status(const wchar_t* text) override;
    /// Counts and writes an error. Returns false.
    bool error(int code, const wchar_t* text) override;
    bool isErrorShown() override;
    void log(int code, const wchar_t* text) override;
    /// Writes the text.
    /// \throws Assertions::ExProgramAborted always
    [[noreturn]] void abort(int code, const wchar_t* text) override;
    /// Returns the result of the system's controller at the time of construction.
    std::wstring findFile(const wchar_t* fileName, const wchar_t* searchPath,
                          const wchar_t* fallbackSearchPath) override;

    /// Shows progress, the default, or hides it.
    ///
    /// \since 0.2
    void showProgress(bool show);

    /// Returns the number of errors that were reported.
    int errorCount() const;

    /// Erases a progress bar or status. Call it before other code writes to the terminal.
    void clearLine();

  private:
    void line(const char* kind, const wchar_t* text);
    void showOnLine(const std::wstring& text);

    std::ostream& out;
    bool onTerminal;
    bool progressShown = true;
    QrProcessControl* previous;
    std::size_t shownWidth = 0;
    int lastTenth = -1;
    int errors = 0;
};

} // namespace Mz::Tools
