// SPDX-License-Identifier: BSL-1.0
/// The way of numbers past an IO that passes them on (numberRelay.h).
#pragma once

#include "components/componentManager/numberRelay.h"

namespace Mz {

/// Finds the IO that numbers reach through another IO. The classes are known by their addresses: no
/// function of a foreign IO is called.
class NumberPath {
  public:
    explicit NumberPath(QrBufferedIO& io);

    /// Returns the IO that receives a number, which is the first one if it passes none on.
    QrBufferedIO& output() const;
    /// Must be called before a number is written to `output()`. A no-op for an IO that passes none
    /// on.
    void noteNumber(char separator) const;
    /// Returns the IO that supplies a number. Must be called before the number is read.
    QrBufferedIO& input() const;
    /// Must be called after a number was read from `input()`.
    void noteRead(int bytes) const;

  private:
    QrBufferedIO& io;
    QrNumberRelay::Functions functions;
};

} // namespace Mz
