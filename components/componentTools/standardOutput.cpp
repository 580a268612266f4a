// SPDX-License-Identifier: BSL-1.0
/// Standard output is redirected at the level of file descriptors, because components may write by
/// any stream or system call. Results are collected and written in large blocks.
#include "components/componentTools/standardOutput.h"

#include "components/componentTools/platform/system.h"

#include <clocale>
#include <cstdio>
#include <iostream>
#include <utility>

namespace Mz::Tools {

void prepareProgram() {
    std::setlocale(LC_ALL, "");
    System::resetChildSignal();
}

ReservedOutput::ReservedOutput() : descriptor(-1) {
    // Earlier output belongs to the original standard output.
    std::cout.flush();
    std::fflush(stdout);
    descriptor = System::reserveOutput();
}

ReservedOutput::~ReservedOutput() {
    sync();
}

ReservedOutput::int_type ReservedOutput::overflow(int_type character) {
    if (!traits_type::eq_int_type(character, traits_type::eof()))
        waiting += traits_type::to_char_type(character);
    return traits_type::not_eof(character);
}

std::streamsize ReservedOutput::xsputn(const char* data, std::streamsize count) {
    constexpr std::size_t enough = 65536;
    waiting.append(data, static_cast<std::size_t>(count));
    return waiting.size() < enough || sync() == 0 ? count : 0;
}

int ReservedOutput::sync() {
    const std::string all = std::move(waiting);
    waiting.clear();
    return System::writeReserved(descriptor, all.data(), all.size()) ? 0 : -1;
}

} // namespace Mz::Tools
