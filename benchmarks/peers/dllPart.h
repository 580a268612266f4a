// SPDX-License-Identifier: BSL-1.0
/// The interface of the plug-ins for Boost.DLL and POCO.
#pragma once

class DllPart {
  public:
    virtual ~DllPart() = default;
    virtual long value() const = 0;
};
