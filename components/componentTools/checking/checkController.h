// SPDX-License-Identifier: BSL-1.0
/// A process controller that remembers what an import reports.
#pragma once

#include "components/componentManager/processControl.h"

#include <string>

namespace Mz::Tools {

/// Install it for the thread that imports. Not counted.
class CheckController final : public QrCastImpl<CheckController, QrProcessControl> {
  public:
    /// \param stopAtOnce  tell the work to stop at each of its questions
    explicit CheckController(bool stopAtOnce = false);
    /// Installs the controller that the thread had before.
    ~CheckController() override;
    CheckController(const CheckController&) = delete;
    CheckController& operator=(const CheckController&) = delete;

    void* getContext() override;
    void message(int code, const wchar_t* text) override;
    bool isInterrupted() override;
    bool warning(int code, const wchar_t* text) override;
    bool isProgressShown() override;
    bool progress(float fraction, const wchar_t* text) override;
    bool isStatusShown() override;
    void status(const wchar_t* text) override;
    bool error(int code, const wchar_t* text) override;
    bool isErrorShown() override;
    void log(int code, const wchar_t* text) override;
    [[noreturn]] void abort(int code, const wchar_t* text) override;
    std::wstring findFile(const wchar_t* fileName, const wchar_t* searchPath,
                          const wchar_t* fallbackSearchPath) override;

    int messages = 0;       ///< texts for the user, progress and status excepted
    int questions = 0;      ///< reports whose answer was, or could have been, to stop
    int fractions = 0;      ///< reports of progress
    bool outside = false;   ///< a report of progress was outside 0 … 1, or no number
    float outsideValue = 0; ///< the first of them

  private:
    bool stop;
    QrProcessControl* previous;
};

} // namespace Mz::Tools
