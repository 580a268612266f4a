// SPDX-License-Identifier: BSL-1.0
/// The variable that holds the system-wide controller.
#pragma once

#include <atomic>

namespace Mz {

class QrProcessControl;

/// The system-wide controller. It is constant-initialised to the default controller, so it is valid
/// before any code runs. Defined in `processControl.cpp`, beside the default controller.
extern std::atomic<QrProcessControl*> systemController;

} // namespace Mz
