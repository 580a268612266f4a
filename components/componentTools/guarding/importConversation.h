// SPDX-License-Identifier: BSL-1.0
/// The host's side of a guarded import: reads what the child sends, which a hostile importer may
/// have written, and relays calls to the process controller.
#pragma once

#include "components/componentManager/processControl.h"
#include "components/componentTools/guarding/importMessages.h"

#include <cstdint>
#include <string>

namespace Mz::Tools {

/// The state of one import, as far as the child has reported it. Memory use is bounded by the
/// limits.
class ImportConversation {
  public:
    /// \param receiver  receives the calls; may be null. It and `allowed` must outlive this object.
    ImportConversation(QrProcessControl* receiver, const Kit::ImportLimits& allowed)
        : controller(receiver), limits(allowed) {}

    /// Takes the complete messages from the front of `bytes`, and appends the replies to calls to
    /// `replies`. Ignores everything after the end of the conversation.
    /// \throws whatever the controller throws
    void receive(std::string& bytes, std::string& replies);

    /// Returns whether nothing more can follow: the outcome has arrived, or the child has broken a
    /// rule.
    bool isOver() const { return started && over; }

    /// Returns the outcome, or the rule that was broken; `guardFailed` before either.
    const ImportOutcome& outcome() const { return result; }

    /// Returns whether any valid message has arrived.
    bool hasStarted() const { return started; }

    std::wstring activity;         ///< what the child did last
    ImportConfinement confinement; ///< what the child has given up
    std::string object;            ///< the stored object, so far

  private:
    void take(ImportKind kind, std::string_view payload, std::string& replies);
    void takePiece(std::string_view piece);
    void takeCall(const ControllerCall& call, std::string& replies);
    ControllerReply relay(const ControllerCall& call);
    void breakOff(Kit::ImportVerdict verdict, const std::wstring& detail = {});

    QrProcessControl* controller;
    const Kit::ImportLimits& limits;
    ImportOutcome result;
    std::uint64_t calls = 0;
    bool started = false, over = false;
};

} // namespace Mz::Tools
