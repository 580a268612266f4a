// SPDX-License-Identifier: BSL-1.0
/// A process controller with a default for each function, and its installation.
///
///     class Log final : public Mz::Kit::Controller {
///         void show(Kind, const wchar_t* text) override { window.append(text); }
///     };
///     Log log;
///     const Mz::Kit::ControllerScope installed(log);
///
/// \since 0.2
#pragma once

#include "components/base/assertions.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/processControl.h"

#include <iostream>
#include <string>

namespace Mz::Kit {

/// A process controller that shows messages, warnings and errors as lines on standard error, lets
/// the work continue after warnings, and finds files like the controller before it. Override what
/// should be different.
///
/// References are not counted: keep the controller alive while it is installed. It must not outlive
/// the controller that was the system-wide one at its construction, which finds the files.
///
/// Threads: the functions here may be called from several threads. Lines may then mix.
class Controller : public QrCastImpl<Controller, QrProcessControl> {
  public:
    /// The kinds of text that `show` receives.
    enum class Kind { message, warning, error, abort };

    /// Remembers the present system-wide controller, for `findFile`. Does not install this one (see
    /// `ControllerScope`).
    Controller() : previous(QrGetSystemProcessController()) {}

    Controller(const Controller&) = delete;
    Controller& operator=(const Controller&) = delete;

    /// Shows a text. Writes it as a line to standard error, in the encoding of the locale.
    ///
    /// \param text  the text; not null
    virtual void show([[maybe_unused]] Kind kind, const wchar_t* text) {
        std::cerr << toNarrow(text, '?') + '\n' << std::flush;
    }

    /// Returns null.
    void* getContext() override { return nullptr; }

    /// Shows the text.
    void message(int, const wchar_t* text) override { show(Kind::message, textOrEmpty(text)); }

    /// Returns false: the work is never interrupted.
    bool isInterrupted() override { return false; }

    /// Shows the text. Returns true: continue.
    bool warning(int, const wchar_t* text) override {
        show(Kind::warning, textOrEmpty(text));
        return true;
    }

    /// Returns false, as `isStatusShown` does.
    bool isProgressShown() override { return false; }

    /// Returns true unless the work is interrupted. Shows nothing.
    bool progress(float, const wchar_t*) override { return !isInterrupted(); }

    bool isStatusShown() override { return false; }

    /// Shows nothing.
    void status(const wchar_t*) override {}

    /// Shows the text. Returns false: do not continue.
    bool error(int, const wchar_t* text) override {
        show(Kind::error, textOrEmpty(text));
        return false;
    }

    /// Returns true.
    bool isErrorShown() override { return true; }

    /// Ignores the entry.
    void log(int, const wchar_t*) override {}

    /// Shows the text.
    ///
    /// \throws Assertions::ExProgramAborted  always. An override must throw too.
    [[noreturn]] void abort(int, const wchar_t* text) override {
        show(Kind::abort, textOrEmpty(text));
        Assertions::throwProgramAborted("components/componentKit/controller", __LINE__);
    }

    /// Returns the result of the controller that was the system-wide one at construction. Imports
    /// find only the files that this function finds.
    std::wstring findFile(const wchar_t* fileName, const wchar_t* searchPath,
                          const wchar_t* fallbackSearchPath) override {
        return previous ? previous->findFile(fileName, searchPath, fallbackSearchPath)
                        : std::wstring();
    }

  private:
    QrProcessControl* previous;
};

/// Installs a process controller from construction to destruction, and then the previous one again.
/// Scopes of one kind must end in the reverse order of their construction.
class ControllerScope {
  public:
    /// Where a controller is installed.
    enum Where {
        system, ///< for all threads without a controller of their own
        thread  ///< for the thread that constructs, and destroys, the scope
    };

    /// Installs `controller`, which must stay alive until the scope ends.
    explicit ControllerScope(QrProcessControl& controller, Where place = system)
        : where(place), previous(place == system ? QrGetSystemProcessController()
                                                 : QrGetThreadProcessController()) {
        install(&controller);
    }

    /// Installs the previous controller, or none if there was none.
    ~ControllerScope() { install(previous); }

    ControllerScope(const ControllerScope&) = delete;
    ControllerScope& operator=(const ControllerScope&) = delete;

  private:
    void install(QrProcessControl* controller) const {
        if (where == system)
            QrSetSystemProcessController(controller);
        else
            QrSetThreadProcessController(controller);
    }

    Where where;
    QrProcessControl* previous;
};

} // namespace Mz::Kit
