#pragma once

#include <string>
#include <sys/types.h>
#include <vector>

namespace QVSa::test {

// This test program once more, in a process of its own, doing one of the pieces of work of Work.h. It is started by
// exec and never by a bare fork: the engine is not to be used in a forked process.
class Worker {
 public:
  Worker(const std::string& work, const std::vector<std::string>& arguments);
  ~Worker();
  Worker(Worker&& other) noexcept;
  Worker& operator=(Worker&&) = delete;

  // Lets the work begin: it waits for this, so that several begin together.
  void go();
  // The next line that the work wrote; empty at its end.
  std::string line();
  // The lines that are left, up to the end of the work.
  std::vector<std::string> lines();
  // Ends the process in the middle of whatever it does.
  void kill();

 private:
  pid_t process_ = 0;
  int start_ = -1;  // closed by go()
  int output_ = -1;
  std::string read_;
};

}  // namespace QVSa::test
