#include "components/componentTools/console.h"

#include "components/base/assertions.h"
#include "components/componentTools/platform/system.h"

#include <algorithm>
#include <atomic>
#include <cmath>
#include <csignal>
#include <cstdio>
#include <iostream>
#include <rang.hpp>

namespace Mz::Tools {

namespace {

constexpr const char* source = "components/componentTools/console";

std::atomic<bool> interrupted{false};
static_assert(std::atomic<bool>::is_always_lock_free); // A handler of a signal sets it.

/// How many controllers there are, and what Ctrl-C did before.
int controllers = 0;
void (*previousHandler)(int) = SIG_DFL;

void onInterrupt(int) {
    interrupted = true;
    // The next one ends the process, should the work not listen.
    std::signal(SIGINT, SIG_DFL);
}

std::string errorText(const wchar_t* text) {
    return System::encode(text ? text : L"", 2);
}

} // namespace

ConsoleController::ConsoleController()
    : ConsoleController(std::cerr, rang::rang_implementation::isTerminal(std::cerr.rdbuf())) {}

ConsoleController::ConsoleController(std::ostream& stream, bool terminal)
    : out(stream), onTerminal(terminal), previous(QrGetSystemProcessController()) {
    if (controllers++ == 0) {
        interrupted = false;
        previousHandler = std::signal(SIGINT, onInterrupt);
    }
}

ConsoleController::~ConsoleController() {
    clearLine();
    if (--controllers == 0)
        std::signal(SIGINT, previousHandler == SIG_ERR ? SIG_DFL : previousHandler);
}

void* ConsoleController::getContext() {
    return nullptr;
}

void ConsoleController::message(int, const wchar_t* text) {
    line(nullptr, text);
}

bool ConsoleController::isInterrupted() {
    return interrupted;
}

bool ConsoleController::warning(int, const wchar_t* text) {
    line("warning", text);
    return !interrupted;
}

bool ConsoleController::isProgressShown() {
    return true;
}

bool ConsoleController::progress(float fraction, const wchar_t* text) {
    const float part = std::isnan(fraction) ? 0.0f : std::clamp(fraction, 0.0f, 1.0f);
    const int percent = static_cast<int>(static_cast<double>(part) * 100.0 + 0.001);
    if (onTerminal) {
        constexpr std::size_t width = 30;
        const std::size_t filled = static_cast<std::size_t>(percent) * width / 100;
        char bar[64];
        std::snprintf(bar, sizeof bar, "[%-*s] %3d%% ", static_cast<int>(width),
                      std::string(filled, '#').c_str(), percent);
        showOnLine(bar + errorText(text));
    } else if (percent / 10 != lastTenth) {
        out << percent << "% " << errorText(text) << std::endl;
    }
    lastTenth = percent / 10;
    return !interrupted;
}

bool ConsoleController::isStatusShown() {
    return true;
}

void ConsoleController::status(const wchar_t* text) {
    if (onTerminal)
        showOnLine(errorText(text));
    else
        line(nullptr, text);
}

bool ConsoleController::error(int, const wchar_t* text) {
    ++errors;
    line("error", text);
    return false;
}

bool ConsoleController::isErrorShown() {
    return true;
}

void ConsoleController::log(int, const wchar_t* text) {
    line(nullptr, text);
}

void ConsoleController::abort(int, const wchar_t* text) {
    line("abort", text);
    Assertions::throwProgramAborted(source, __LINE__);
}

std::wstring ConsoleController::findFile(const wchar_t* fileName, const wchar_t* searchPath,
                                         const wchar_t* fallbackSearchPath) {
    return previous ? previous->findFile(fileName, searchPath, fallbackSearchPath) : std::wstring();
}

int ConsoleController::errorCount() const {
    return errors;
}

void ConsoleController::line(const char* kind, const wchar_t* text) {
    clearLine();
    if (kind)
        out << rang::style::bold << rang::fg::red << kind << rang::style::reset << ": ";
    out << errorText(text) << std::endl;
}

/// What does not fit a narrow terminal is cut, or it could not be taken back.
void ConsoleController::showOnLine(const std::string& text) {
    constexpr std::size_t widest = 79;
    const std::string shown = text.substr(0, widest);
    out << '\r' << shown << std::string(shownWidth - std::min(shownWidth, shown.size()), ' ')
        << std::flush;
    shownWidth = shown.size();
}

void ConsoleController::clearLine() {
    if (shownWidth > 0)
        out << '\r' << std::string(shownWidth, ' ') << '\r' << std::flush;
    shownWidth = 0;
}

std::string forOutput(const std::wstring& text) {
    return System::encode(text, 1);
}

std::vector<std::string> argumentsOfProcess(int count, char** values) {
    return System::arguments(count, values);
}

std::filesystem::path pathOf(const std::string& argument) {
    return System::pathOfArgument(argument);
}

} // namespace Mz::Tools
