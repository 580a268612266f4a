// SPDX-License-Identifier: BSL-1.0
/// Keeps the texts of an exception.
///
/// Both texts are composed when they are set, not when they are read: the getters then return plain
/// pointers that stay valid, need no memory and cannot fail inside a handler.
#include "components/base/exBase.h"

namespace Mz {

ExBase::ExBase(const char* file, int line)
    : position(std::string(file ? file : "") + "(" + std::to_string(line) + ")"),
      detailedReason(position) {}

ExBase::ExBase(const ExBase& other) = default;
ExBase& ExBase::operator=(const ExBase& other) = default;
ExBase::~ExBase() = default;

const char* ExBase::getReason() const {
    return reason.c_str();
}

const char* ExBase::getDetailedReason() const {
    return detailedReason.c_str();
}

void ExBase::setReason(const char* text) {
    // Both texts are composed before either is stored, so that a failed allocation changes nothing.
    std::string newReason(text ? text : "");
    std::string newDetailedReason = position + ": " + newReason;
    reason.swap(newReason);
    detailedReason.swap(newDetailedReason);
}

} // namespace Mz
