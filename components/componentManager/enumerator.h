// SPDX-License-Identifier: BSL-1.0
/// Enumerators: callbacks that receive the elements of a sequence.
///
/// An enumerating function takes an enumerator by reference and returns the action that ended the
/// enumeration:
/// 1. It calls `process(element)` for each element in order. If the result is not `Continue`, it
///    returns that result unchanged, and calls neither `process` nor `finished` again.
/// 2. After the last element, or if there are no elements, it returns the result of `finished()`.
///
/// The caller owns the enumerator, usually as a local. The enumerating function does not use it
/// after the call. All callbacks run on the caller's thread, and their exceptions propagate.
#pragma once

#include "components/componentManager/export.h"

namespace Mz {

/// Scope of `Action`, the result of an enumerator's callback.
class QrEnum {
  public:
    /// The result of a callback. The enumerating function only distinguishes zero and non-zero. It
    /// returns any 32-bit value unchanged.
    enum Action : int {
        Continue = 0, ///< continue with the next element
        Stop = 1,     ///< stop with success
        Fail = 2      ///< stop with a failure that further elements cannot repair
    };

  protected:
    ~QrEnum() = default;
};

/// The callback interface of an enumeration over elements of type `T`.
template <class T>
class MZ_SHARED_TYPE QrEnumerator : public virtual QrEnum {
  public:
    virtual ~QrEnumerator() = default;

    /// Receives one element. Called once for each element, in order.
    ///
    /// \param element  the element; if it is a smart reference, the callee owns it and may keep it
    /// \return `Continue` for the next element, any other value to end the enumeration
    virtual Action process(T element) = 0;

    /// Called once after the last element, unless `process` ended the enumeration. The default
    /// returns `Continue`.
    ///
    /// \return the result of the whole enumeration
    virtual Action finished() { return Continue; }

  private:
    virtual void forceVtblInstantiation() {}
};

} // namespace Mz
