// SPDX-License-Identifier: BSL-1.0
/// All controllers share one flag, which the SIGINT handler sets: a signal handler has no object to
/// address. The first controller installs the handler, and the last one restores the old handler.
/// On a terminal, output is cut to 79 columns, because a wrapped line could not be erased.
#include "components/componentTools/console.h"

#include "components/base/assertions.h"
#include "components/base/surrogates.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/consoleText.h"
#include "components/componentTools/platform/system.h"

#include <algorithm>
#include <atomic>
#include <cmath>
#include <csignal>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <iterator>
#include <rang.hpp>
#include <string>
#include <string_view>
#include <utility>

namespace Mz::Tools {

namespace {

constexpr const char* source = "components/componentTools/console";

std::atomic<bool> interrupted{false};
static_assert(std::atomic<bool>::is_always_lock_free); // The signal handler sets it.

/// The number of controllers, and the SIGINT handler before the first one.
int controllers = 0;
void (*previousHandler)(int) = SIG_DFL;

void onInterrupt(int) {
    interrupted = true;
    // The next Ctrl-C ends the process, even if the work does not poll `isInterrupted`.
    std::signal(SIGINT, SIG_DFL);
}

std::string errorText(const wchar_t* text) {
    return System::encode(withoutControls(textOrEmpty(text), L"\n\t"), 2);
}

/// Returns the maximum number of terminal columns of a character.
std::size_t columnsOf(wchar_t character) {
    constexpr std::pair<std::uint32_t, std::uint32_t> wide[] = {
        {0x1100, 0x115F},   {0x2600, 0x27BF},  {0x2E80, 0xA4CF}, {0xAC00, 0xD7A3},
        {0xF900, 0xFAFF},   {0xFE30, 0xFE6F},  {0xFF00, 0xFF60}, {0xFFE0, 0xFFE6},
        {0x1F000, 0x1FAFF}, {0x20000, 0x3FFFD}};
    const std::uint32_t code = std::char_traits<wchar_t>::to_int_type(character);
    const bool isWide = std::any_of(std::begin(wide), std::end(wide), [&](const auto& range) {
        return code >= range.first && code <= range.second;
    });
    return isWide ? 2 : 1;
}

/// Returns the longest prefix of `text` that fits into `widest` columns, and its width.
std::pair<std::wstring, std::size_t> fitted(const std::wstring& text, std::size_t widest) {
    std::size_t taken = 0, length = 0;
    for (; length < text.size(); ++length) {
        const std::size_t columns = columnsOf(text[length]);
        if (taken + columns > widest)
            break;
        taken += columns;
    }
    // Do not split a surrogate pair.
    if (length > 0 && length < text.size() &&
        detail::isHighSurrogate(std::char_traits<wchar_t>::to_int_type(text[length - 1])))
        --length, --taken;
    return {text.substr(0, length), taken};
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
    return progressShown;
}

bool ConsoleController::progress(float fraction, const wchar_t* text) {
    if (!progressShown)
        return !interrupted;
    const float part = std::isnan(fraction) ? 0.0f : std::clamp(fraction, 0.0f, 1.0f);
    const int percent = static_cast<int>(static_cast<double>(part) * 100.0 + 0.001);
    if (onTerminal) {
        constexpr std::size_t width = 30;
        const std::size_t filled = static_cast<std::size_t>(percent) * width / 100;
        char bar[64];
        std::snprintf(bar, sizeof bar, "[%-*s] %3d%% ", static_cast<int>(width),
                      std::string(filled, '#').c_str(), percent);
        showOnLine(std::wstring(bar, bar + std::strlen(bar)) + textOrEmpty(text));
    } else if (percent / 10 != lastTenth) {
        out << percent << "% " << System::encode(withoutControls(textOrEmpty(text), {}), 2)
            << std::endl;
    }
    lastTenth = percent / 10;
    return !interrupted;
}

bool ConsoleController::isStatusShown() {
    return true;
}

void ConsoleController::status(const wchar_t* text) {
    if (onTerminal)
        showOnLine(textOrEmpty(text));
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

void ConsoleController::showProgress(bool show) {
    progressShown = show;
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

void ConsoleController::showOnLine(const std::wstring& text) {
    constexpr std::size_t widest = 79;
    const auto [fitting, width] = fitted(withoutControls(text, {}), widest);
    out << '\r' << System::encode(fitting, 2)
        << std::string(shownWidth - std::min(shownWidth, width), ' ') << std::flush;
    shownWidth = width;
}

void ConsoleController::clearLine() {
    if (shownWidth > 0)
        out << '\r' << std::string(shownWidth, ' ') << '\r' << std::flush;
    shownWidth = 0;
}

} // namespace Mz::Tools
