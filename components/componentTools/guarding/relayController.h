// SPDX-License-Identifier: BSL-1.0
/// The process controller of the child of a guarded import.
#pragma once

#include "components/componentManager/processControl.h"
#include "components/componentTools/guarding/importMessages.h"
#include "components/componentTools/platform/system.h"

#include <chrono>
#include <mutex>
#include <optional>
#include <string>

namespace Mz::Tools {

/// Reads the messages of the host.
class HostMessages {
  public:
    explicit HostMessages(System::InputPipe& pipe) : input(pipe) {}

    /// Waits for the next message and returns its payload; `std::nullopt` at the end, and if it is
    /// not of this kind.
    std::optional<std::string> next(ImportKind kind);

  private:
    System::InputPipe& input;
    std::string bytes; ///< received, and not used yet
};

/// Sends every call to the host, and waits for the reply to those that have a result.
///
/// Threads: an importer may call it from several threads, one of which waits for its reply while
/// the others wait for their turn.
class RelayController final : public QrCastImpl<RelayController, QrProcessControl> {
  public:
    /// All must outlive this object.
    RelayController(System::AnswerPipe& output, HostMessages& input, const ImportTask& given)
        : answers(output), host(input), task(given) {}

    void* getContext() override { return nullptr; }
    void message(int code, const wchar_t* text) override;
    /// Returns false: the host asks its own controller and kills this process.
    bool isInterrupted() override { return false; }
    bool warning(int code, const wchar_t* text) override;
    bool isProgressShown() override { return task.progressShown; }
    bool progress(float fraction, const wchar_t* text) override;
    bool isStatusShown() override { return task.statusShown; }
    void status(const wchar_t* text) override;
    bool error(int code, const wchar_t* text) override;
    bool isErrorShown() override { return task.errorShown; }
    void log(int code, const wchar_t* text) override;
    [[noreturn]] void abort(int code, const wchar_t* text) override;
    std::wstring findFile(const wchar_t* fileName, const wchar_t* searchPath,
                          const wchar_t* fallbackSearchPath) override;

  private:
    using Clock = std::chrono::steady_clock;

    ControllerReply call(const ControllerCall& call);
    /// Returns whether a report that may be omitted is due. Requires the lock.
    static bool isDue(std::optional<Clock::time_point>& last);

    System::AnswerPipe& answers;
    HostMessages& host;
    const ImportTask& task;
    std::mutex mutex;
    std::optional<Clock::time_point> lastProgress, lastStatus;
    bool continues = true; ///< the last reply to `progress`
};

} // namespace Mz::Tools
