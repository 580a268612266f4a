// SPDX-License-Identifier: BSL-1.0
/// What the host and the component of the compatibility trial exchange: everything whose binary
/// form depends on the compiler, its options or the standard library.
#pragma once

#include "components/componentManager/cast.h"
#include "components/componentManager/stream.h"

#include <string>
#include <vector>

namespace Mz::Test {

class Trial : public QrCastable {
  public:
    using Self = Trial;
    static constexpr QrUid uid{0x7A1C0B01, 0xC7B711F0, 0x8E2B1D00, 0x4F60A9D7};

    /// Returns the parts, joined by L'-'.
    virtual std::wstring join(const std::vector<std::wstring>& parts) const = 0;

    /// Returns the characters of `text`, one in each element.
    virtual std::vector<std::string> split(const std::string& text) const = 0;

    /// Writes `text` and two numbers.
    virtual void store(QrStream& stream, const std::wstring& text) const = 0;

    /// Reads what `store` wrote, and returns whether it is `text` and the same numbers.
    virtual bool matches(QrStream& stream, const std::wstring& text) const = 0;

    /// Returns what the component itself writes through the library onto a standard stream.
    virtual std::string written(const std::wstring& text) const = 0;

    /// Returns whether the component was compiled with exceptions. Only then it is asked for more.
    virtual bool hasExceptions() const = 0;

    /// Throws: 0 an exception of the library, 1 a `std::runtime_error`, 2 an `int`.
    virtual void fail(int kind) const = 0;

    /// Reads an `int` and returns the reason of the exception that the library throws.
    virtual std::string failureOf(QrStream& stream) const = 0;

    /// Runs a thread and returns what it computed.
    virtual int fromThread() const = 0;
};

/// The builder of the trial's object.
inline constexpr QrUid trialBuilderUid{0x7A1C0B02, 0xC7B711F0, 0x8E2B1D00, 0x4F60A9D7};

} // namespace Mz::Test
