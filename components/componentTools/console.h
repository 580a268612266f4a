/// For hosts without a window: a process controller that people can read, and the console's way of
/// writing names and texts.
#pragma once

#include "components/componentTools/export.h"

#include "components/componentManager/processControl.h"

#include <filesystem>
#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

namespace Mz::Tools {

/// Writes messages as text, in the terminal's encoding, to the standard error stream. They may have
/// lines and tabulators; other control characters show as `\xNN`.
///
/// Progress is a bar that stays on its line where standard error is a terminal; elsewhere it is a
/// line of its own for each tenth of the work. Warnings and errors say so, in colour on a terminal.
///
/// While one of these exists, Ctrl-C does not end the process: `isInterrupted` then answers true,
/// and so do `warning`, `progress` and `error` answer false, so that work stops at its next report.
/// A second Ctrl-C ends the process as ever.
///
/// Not counted: install it with `QrSetSystemProcessController` or for one thread, keep it alive
/// while it is installed, and use it from one thread at a time.
class MZ_COMPONENT_TOOLS_API ConsoleController final
    : public QrCastImpl<ConsoleController, QrProcessControl> {
  public:
    ConsoleController();
    /// The same on another stream, which must outlive it; `terminal` says whether that is one.
    ConsoleController(std::ostream& stream, bool terminal);
    ~ConsoleController() override;
    ConsoleController(const ConsoleController&) = delete;
    ConsoleController& operator=(const ConsoleController&) = delete;

    void* getContext() override;
    void message(int code, const wchar_t* text) override;
    bool isInterrupted() override;
    bool warning(int code, const wchar_t* text) override;
    bool isProgressShown() override;
    /// A fraction outside 0 to 1 counts as the nearer of the two; what is no number as 0.
    bool progress(float fraction, const wchar_t* text) override;
    bool isStatusShown() override;
    void status(const wchar_t* text) override;
    bool error(int code, const wchar_t* text) override;
    bool isErrorShown() override;
    void log(int code, const wchar_t* text) override;
    /// Throws `Assertions::ExProgramAborted`.
    [[noreturn]] void abort(int code, const wchar_t* text) override;
    /// As the controller that was the system's when this one was made.
    std::wstring findFile(const wchar_t* fileName, const wchar_t* searchPath,
                          const wchar_t* fallbackSearchPath) override;

    /// How many errors were reported.
    int errorCount() const;

    /// Takes a bar or status from its line; call it before others write to the terminal.
    void clearLine();

  private:
    void line(const char* kind, const wchar_t* text);
    void showOnLine(const std::wstring& text);

    std::ostream& out;
    bool onTerminal;
    QrProcessControl* previous;
    std::size_t shownWidth = 0;
    int lastTenth = -1;
    int errors = 0;
};

/// `text` with each control character, line ends too, in the form `\xNN`: a terminal may do more
/// than show them, and a name need not stay on its line.
MZ_COMPONENT_TOOLS_API std::wstring withoutControls(const std::wstring& text);

/// `text` as bytes for standard output: in the terminal's encoding where it is one, else in the
/// locale's; '?' for what has no form there.
MZ_COMPONENT_TOOLS_API std::string forOutput(const std::wstring& text);

/// The arguments of this process without its name: the system's own bytes, or UTF-8 where names are
/// not bytes. Takes what `main` was given.
MZ_COMPONENT_TOOLS_API std::vector<std::string> argumentsOfProcess(int count, char** values);

/// The path that such an argument names.
MZ_COMPONENT_TOOLS_API std::filesystem::path pathOf(const std::string& argument);

} // namespace Mz::Tools
