/// Sequences that are handed out by calling back.
///
/// An enumerating operation takes an enumerator by reference, offers it one element after the other
/// and returns the action that ended the walk:
/// 1. For each element in order, `process(element)`; a result other than `Continue` is returned at
///    once, unchanged, and neither another element nor `finished` follows.
/// 2. When the elements are used up, also when there were none, the result of `finished()`.
///
/// The enumerator belongs to the caller, usually on its stack; it is never kept beyond the call.
/// Everything runs on the caller's thread, and exceptions of `process` pass through.
#pragma once

#include "components/componentManager/export.h"

namespace Mz {

/// Gives enumerators their verdicts.
class QrEnum {
  public:
    /// What a callback wants to happen. Only zero or not zero matters to whoever enumerates; any
    /// 32-bit value is passed on unchanged.
    enum Action : int {
        Continue = 0, ///< go on with the next element
        Stop = 1,     ///< found what was wanted: stop, and report success
        Fail = 2      ///< stop: no further element can mend it
    };

  protected:
    ~QrEnum() = default;
};

/// The callback of an enumeration over `T`.
template <class T>
class MZ_SHARED_TYPE QrEnumerator : public virtual QrEnum {
  public:
    virtual ~QrEnumerator() = default;

    /// Called once for each element, in order. References among the elements belong to the callee.
    virtual Action process(T element) = 0;

    /// Called once when the sequence ran out without a callback stopping it.
    virtual Action finished() { return Continue; }

  private:
    virtual void forceVtblInstantiation() {}
};

} // namespace Mz
