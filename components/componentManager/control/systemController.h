/// The system-wide controller, where its default is.
#pragma once

#include <atomic>

namespace Mz {

class QrProcessControl;

/// The system-wide controller; from the very beginning, before any code has run, the default
/// controller.
extern std::atomic<QrProcessControl*> systemController;

} // namespace Mz
