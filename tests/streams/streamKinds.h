// SPDX-License-Identifier: BSL-1.0
/// Streams and buffers for which the library must not take a short cut, and the stream base class.
#pragma once

#include "components/componentManager/stream.h"

#include <sstream>

namespace Mz::Test {

/// QrStream alone: single values are text, arrays are binary.
class BaseStream final : public QrStream {
  public:
    explicit BaseStream(QrCastable* io) : QrStream(io) {}
};

/// A subclass of a standard buffer. It could override any call, so the library must make them all.
class WatchedBuffer final : public std::stringbuf {
  public:
    using std::stringbuf::stringbuf;
};

/// An input class from outside the library, for which it takes no short cut.
class ForeignInput final : public QrInBuffer {
  public:
    using QrInBuffer::QrInBuffer;
};

} // namespace Mz::Test
