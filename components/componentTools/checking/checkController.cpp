// SPDX-License-Identifier: BSL-1.0
/// It says that progress and errors are shown, so that an import reports them.
#include "components/componentTools/checking/checkController.h"

#include "components/base/assertions.h"

#include <utility>

namespace Mz::Tools {

CheckController::CheckController(bool stopAtOnce)
    : stop(stopAtOnce), previous(QrGetThreadProcessController()) {
    QrSetThreadProcessController(this);
}

CheckController::~CheckController() {
    QrSetThreadProcessController(previous);
}

void* CheckController::getContext() {
    return nullptr;
}

void CheckController::message(int, const wchar_t*) {
    ++messages;
}

bool CheckController::isInterrupted() {
    ++questions;
    return stop;
}

bool CheckController::warning(int, const wchar_t*) {
    ++messages;
    ++questions;
    return !stop;
}

bool CheckController::isProgressShown() {
    return true;
}

bool CheckController::progress(float fraction, const wchar_t*) {
    // The comparison is false for NaN, too.
    if (!(fraction >= 0 && fraction <= 1) && !std::exchange(outside, true))
        outsideValue = fraction;
    ++fractions;
    if (fraction < 1)
        ++questions;
    return !stop;
}

bool CheckController::isStatusShown() {
    return true;
}

void CheckController::status(const wchar_t*) {}

bool CheckController::error(int, const wchar_t*) {
    ++messages;
    return false;
}

bool CheckController::isErrorShown() {
    return true;
}

void CheckController::log(int, const wchar_t*) {
    ++messages;
}

void CheckController::abort(int, const wchar_t*) {
    ++messages;
    Assertions::throwProgramAborted("components/componentTools/checking/checkController", __LINE__);
}

std::wstring CheckController::findFile(const wchar_t* fileName, const wchar_t* searchPath,
                                       const wchar_t* fallbackSearchPath) {
    return QrGetSystemProcessController()->findFile(fileName, searchPath, fallbackSearchPath);
}

} // namespace Mz::Tools
