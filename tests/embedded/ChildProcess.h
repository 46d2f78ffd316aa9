#pragma once

#include <functional>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

namespace QVSa::embedded {

// Runs the body in a forked process. The body's result is the exit code; 99 stands for an exception.
class ChildProcess {
 public:
  explicit ChildProcess(const std::function<int()>& body) : id_(::fork()) {
    if (id_ != 0) return;
    int code = 99;
    try {
      code = body();
    } catch (...) {
    }
    ::_exit(code);
  }

  int exitCode() {
    int status = 0;
    ::waitpid(id_, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
  }

  void kill() {
    ::kill(id_, SIGKILL);
    ::waitpid(id_, nullptr, 0);
  }

 private:
  pid_t id_;
};

}  // namespace QVSa::embedded
