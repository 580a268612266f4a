/// A process controller that can be read, for programs with a command line.
#pragma once

#include "components/componentManager/processControl.h"

namespace Meshes {

/// Writes every text as a line of its own to the standard error, and progress, when it is asked to,
/// as a percentage that is written over by the next. Files are looked for by the controller that it
/// stands in for. For one thread.
class ConsoleController final : public Mz::QrCastImpl<ConsoleController, Mz::QrProcessControl> {
  public:
    /// Installs itself as the system-wide controller, and takes itself out again at its end.
    explicit ConsoleController(bool showProgress);
    ~ConsoleController() override;
    ConsoleController(const ConsoleController&) = delete;
    ConsoleController& operator=(const ConsoleController&) = delete;

    /// How many errors were reported so far.
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
