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
    // Both texts are complete before either is taken, so that a failed allocation changes nothing.
    std::string newReason(text ? text : "");
    std::string newDetailedReason = position + ": " + newReason;
    reason.swap(newReason);
    detailedReason.swap(newDetailedReason);
}

} // namespace Mz
