// SPDX-License-Identifier: BSL-1.0
/// A process controller for command-line programs, which prints texts.
#pragma once

#include "components/componentManager/processControl.h"

namespace Meshes {

/// Writes every text as a line to the standard error and, if requested, progress as a percentage
/// that the next one overwrites. The previous controller finds files. For use by one thread.
class ConsoleController final : public Mz::QrCastImpl<ConsoleController, Mz::QrProcessControl> {
  public:
    /// Installs itself as the system-wide controller. The destructor restores the previous one.
    explicit ConsoleController(bool showProgress);
    ~ConsoleController() override;
    ConsoleController(const ConsoleController&) = delete;
    ConsoleController& operator=(const ConsoleController&) = delete;

    /// Returns the number of errors reported so far.
    int errorCount() const { return errors; }

    void* getContext() override { return nullptr; }
    void message(int code, const wchar_t* text) override;
    bool isInterrupted() override { return false; }
    bool warning(int code, const wchar_t* text) override;
    bool isProgressShown() override { return showProgress; }
    bool progress(float fraction, const wchar_t* text) override;
    bool isStatusShown() override { return false; }
    void status(const wchar_t*) override {}
    bool error(int code, const wchar_t* text) override;
    bool isErrorShown() override { return true; }
    void log(int, const wchar_t*) override {}
    [[noreturn]] void abort(int code, const wchar_t* text) override;
    std::wstring findFile(const wchar_t* fileName, const wchar_t* searchPath,
                          const wchar_t* fallbackSearchPath) override;

  private:
    void writeLine(const char* kind, const wchar_t* text);

    Mz::QrProcessControl* previous;
    bool showProgress;
    int errors = 0;
    int shownPercentage = -1;
};

} // namespace Meshes
