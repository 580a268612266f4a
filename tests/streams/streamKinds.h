// SPDX-License-Identifier: BSL-1.0
/// Streams whose every call might be watched, and one kind of stream more.
#pragma once

#include "components/componentManager/stream.h"

#include <sstream>

namespace Mz::Test {

/// The base by itself: single values are text, counted ones are binary.
class BaseStream final : public QrStream {
  public:
    explicit BaseStream(QrCastable* io) : QrStream(io) {}
};

/// A buffer that is none of the standard library's own: every call might be watched.
class WatchedBuffer final : public std::stringbuf {
  public:
    using std::stringbuf::stringbuf;
};

/// An IO of which the library cannot know what it does.
class ForeignInput final : public QrInBuffer {
  public:
    using QrInBuffer::QrInBuffer;
};

} // namespace Mz::Test
