// SPDX-License-Identifier: BSL-1.0
/// What the two processes of a check say to each other: the task for the child process, and the
/// messages that it sends back.
#pragma once

#include "components/componentTools/check.h"

#include <functional>
#include <map>
#include <set>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Tools {

/// What one child process does.
struct CheckTask {
    std::filesystem::path file;
    std::vector<std::filesystem::path> samples;
    std::vector<std::string> rules; ///< the identifiers of the rules to check; empty for a survey
    std::set<std::string> avoided;  ///< activities that ended an earlier process
    std::uint32_t seed = 1;
    int fuzzMilliseconds = 0;
    bool threadSafe = false;
    int builder = -1; ///< check only this builder, by its index; -1 for all
    int input = -1;   ///< use only this input; -1 for all
    // The surroundings of a survey.
    int memoryPattern = 0x5A;
    bool otherLocale = false, otherFolder = false, noInput = false;
};

/// Returns the task without its paths as ASCII text, which is valid in every locale.
std::string encodeTask(const CheckTask& task);

/// Returns the task that `encodeTask` encoded, without paths.
/// \throws std::exception if the text is invalid
CheckTask decodeCheckTask(const std::string& text);

/// What the child does at the moment, in case that it does not survive it.
struct CheckActivity {
    std::string key;       ///< identifies the activity, in UTF-8; empty if there is none
    std::wstring what;     ///< for the sentence, for example "createObject"
    std::wstring place;    ///< for the finding
    std::wstring detail;   ///< for example the input; may be empty
    std::string reproduce; ///< for the finding; may be empty
};

/// Sends the messages of the child.
class CheckSender {
  public:
    /// \param write  receives each message as bytes
    explicit CheckSender(std::function<void(const std::string&)> write)
        : output(std::move(write)) {}

    void rule(const std::string& id);
    /// Sends the activity unless it is the one that was sent last. An activity that is repeated for
    /// long is sent again and again, since the parent process limits the time between messages.
    void activity(const CheckActivity& activity);
    void finding(const CheckFinding& finding);
    void builder(const CheckedBuilder& builder);
    /// Sends one answer of a survey. Keys must differ.
    void answer(const std::wstring& key, const std::string& value);
    /// Says that the rule that was begun last cannot be checked here.
    void skipped();
    void done();

    /// Returns the message that says how the process is about to end.
    static std::string faultMessage(const std::wstring& text);

  private:
    std::function<void(const std::string&)> output;
    std::string lastActivity;
    std::chrono::steady_clock::time_point lastTime{};
};

/// The decoded messages.
struct CheckReport {
    bool done = false;
    bool garbled = false;
    std::string rule; ///< the rule that was checked last; empty if none was
    CheckActivity activity;
    std::wstring fault; ///< how the process ended, if it knew
    std::vector<CheckFinding> findings;
    std::vector<CheckedBuilder> builders;
    std::vector<std::string> skipped; ///< rules that cannot be checked
    std::map<std::wstring, std::string> answers;
};

/// Decodes the complete messages at the front of `bytes`, adds them to the report and removes them.
/// Stops at the first invalid byte.
void decodeReport(std::string& bytes, CheckReport& report);

} // namespace Mz::Tools
