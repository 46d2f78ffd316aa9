#include "tests/support/RecordingProvider.h"

namespace QVSa::test {

class RecordingProvider::RecordedSession : public ProviderSession {
 public:
  RecordedSession(RecordingProvider& recorder, std::unique_ptr<ProviderSession> session)
      : recorder_(recorder), session_(std::move(session)) {
    ++recorder_.openSessions_;
  }
  ~RecordedSession() override {
    recorder_.log_.push_back("close");
    --recorder_.openSessions_;
  }

  BatchResult run(const Batch& batch) override {
    recorder_.pass(batch.text);
    return session_->run(batch);
  }
  void begin() override {
    recorder_.pass("begin");
    session_->begin();
  }
  void commit() override {
    recorder_.pass("commit");
    session_->commit();
  }
  void rollback() override {
    recorder_.log_.push_back("rollback");
    session_->rollback();
  }

 private:
  RecordingProvider& recorder_;
  std::unique_ptr<ProviderSession> session_;
};

RecordingProvider::RecordingProvider()
    : before_(interposeOpener([this](const ConnectionOptions& options) { return open(options); })) {}

RecordingProvider::~RecordingProvider() { interposeOpener(std::move(before_)); }

void RecordingProvider::failAt(int event, const Failure& failure) {
  failingEvent_ = event;
  failure_ = failure;
}

std::unique_ptr<ProviderSession> RecordingProvider::open(const ConnectionOptions& options) {
  if (acting_) return before_(options);
  pass("open " + options.database);
  return std::make_unique<RecordedSession>(*this, before_(options));
}

void RecordingProvider::pass(const String& event) {
  log_.push_back(event);
  if (action_) {
    acting_ = true;
    action_(event);
    acting_ = false;
  }
  if (++events_ != failingEvent_) return;
  failed_ = true;
  throw *failure_;
}

}  // namespace QVSa::test
