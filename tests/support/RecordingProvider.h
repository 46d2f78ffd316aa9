#pragma once

#include <functional>
#include <optional>

#include "QVSa/frame/internal/Providers.h"

namespace QVSa::test {

// Stands between the library and its providers while it lives and writes down all that passes, in order. It can fail
// one event in the provider's place, and it lets a test act in between. Not to be left while a session is open.
class RecordingProvider {
 public:
  RecordingProvider();
  ~RecordingProvider();
  RecordingProvider(const RecordingProvider&) = delete;
  RecordingProvider& operator=(const RecordingProvider&) = delete;

  // The events are the openings, the statements, the beginnings and the commits, counted from 1. The one chosen does
  // not reach the provider.
  void failAt(int event, const Failure& failure);
  // Whether the chosen event came.
  bool hasFailed() const { return failed_; }
  // Called with each event before it goes on to the provider; what the call itself does is not recorded.
  void beforeEach(std::function<void(const String& event)> action) { action_ = std::move(action); }

  // "open QVSys", the statement texts, "begin", "commit", "rollback", "close".
  const std::vector<String>& log() const { return log_; }
  int openSessions() const { return openSessions_; }

 private:
  class RecordedSession;

  std::unique_ptr<ProviderSession> open(const ConnectionOptions& options);
  void pass(const String& event);

  SessionOpener before_;
  std::vector<String> log_;
  int events_ = 0;
  int failingEvent_ = 0;
  std::optional<Failure> failure_;
  bool failed_ = false;
  std::function<void(const String&)> action_;
  bool acting_ = false;
  int openSessions_ = 0;
};

}  // namespace QVSa::test
