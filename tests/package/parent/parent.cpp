// SPDX-License-Identifier: BSL-1.0
#include "components/base/exBase.h"

#include <iostream>

class ParentException final : public Mz::ExBase {
  public:
    ParentException() : ExBase("parent", __LINE__) { setReason("in the parent"); }
    ExBase* clone() const override { return new ParentException(*this); }
};

int main() {
    try {
        throw ParentException();
    } catch (const Mz::ExBase& exception) {
        std::cout << exception.getReason() << std::endl;
    }
}
