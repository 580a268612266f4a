// SPDX-License-Identifier: BSL-1.0
/// The smallest controller that a user can read: texts become lines, `error` counts and returns
/// false, `abort` throws. `findFile` is forwarded to the previous controller, because importers
/// find nothing without it.
#include "consoleController.h"

#include "console.h"

#include "components/base/assertions.h"

#include <iostream>

namespace Meshes {

namespace {

std::string outputOf(const wchar_t* text) {
    return text ? console::outputText(text) : std::string();
}

} // namespace

ConsoleController::ConsoleController(bool showProgress)
    : previous(QrGetSystemProcessController()), showProgress(showProgress) {
    QrSetSystemProcessController(this);
}

ConsoleController::~ConsoleController() {
    QrSetSystemProcessController(previous);
}

void ConsoleController::message(int, const wchar_t* text) {
    writeLine("", text);
}

bool ConsoleController::warning(int, const wchar_t* text) {
    writeLine("warning: ", text);
    return true;
}

bool ConsoleController::error(int, const wchar_t* text) {
    ++errors;
    writeLine("error: ", text);
    return false;
}

bool ConsoleController::progress(float fraction, const wchar_t* text) {
    const auto percentage = static_cast<int>(fraction * 100.0F);
    if (percentage == shownPercentage)
        return true;
    shownPercentage = percentage;
    std::cerr << '\r' << outputOf(text) << ' ' << percentage << '%'
              << (percentage == 100 ? "\n" : "") << std::flush;
    return true;
}

void ConsoleController::abort(int, const wchar_t* text) {
    writeLine("aborted: ", text);
    Mz::Assertions::throwProgramAborted("examples/mesh/console/consoleController", __LINE__);
}

std::wstring ConsoleController::findFile(const wchar_t* fileName, const wchar_t* searchPath,
                                         const wchar_t* fallbackSearchPath) {
    return previous->findFile(fileName, searchPath, fallbackSearchPath);
}

void ConsoleController::writeLine(const char* kind, const wchar_t* text) {
    // Keeps the order of the lines if both streams go to one terminal or file.
    std::cout.flush();
    std::cerr << kind << outputOf(text) << std::endl;
}

} // namespace Meshes
