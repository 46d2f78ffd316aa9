#include "tests/processes/Worker.h"

#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <stdexcept>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>

namespace QVSa::test {

namespace {

void close(int& file) {
  if (file >= 0) ::close(file);
  file = -1;
}

}  // namespace

Worker::Worker(const std::string& work, const std::vector<std::string>& arguments) {
  int start[2], output[2];
  if (::pipe2(start, O_CLOEXEC) != 0 || ::pipe2(output, O_CLOEXEC) != 0) throw std::runtime_error("no pipe");
  start_ = start[1];
  output_ = output[0];

  std::vector<std::string> words{"process_tests", "--work", work};
  words.insert(words.end(), arguments.begin(), arguments.end());
  std::vector<char*> argv;
  for (auto& word : words) argv.push_back(word.data());
  argv.push_back(nullptr);
  posix_spawn_file_actions_t files;
  posix_spawn_file_actions_init(&files);
  posix_spawn_file_actions_adddup2(&files, start[0], STDIN_FILENO);
  posix_spawn_file_actions_adddup2(&files, output[1], STDOUT_FILENO);
  const int code = ::posix_spawn(&process_, "/proc/self/exe", &files, nullptr, argv.data(), environ);
  posix_spawn_file_actions_destroy(&files);
  close(start[0]);
  close(output[1]);
  if (code != 0) throw std::runtime_error("no process");
}

Worker::Worker(Worker&& other) noexcept
    : process_(std::exchange(other.process_, 0)),
      start_(std::exchange(other.start_, -1)),
      output_(std::exchange(other.output_, -1)),
      read_(std::move(other.read_)) {}

Worker::~Worker() {
  kill();
  close(start_);
  close(output_);
}

void Worker::go() { close(start_); }

std::string Worker::line() {
  for (char buffer[4096]; read_.find('\n') == std::string::npos;) {
    const ssize_t count = ::read(output_, buffer, sizeof buffer);
    // A line that was not finished was never written.
    if (count <= 0) return "";
    read_.append(buffer, static_cast<std::size_t>(count));
  }
  const std::size_t end = read_.find('\n');
  const std::string result = read_.substr(0, end);
  read_.erase(0, end + 1);
  return result;
}

std::vector<std::string> Worker::lines() {
  std::vector<std::string> result;
  for (std::string next = line(); !next.empty(); next = line()) result.push_back(next);
  return result;
}

void Worker::kill() {
  if (process_ == 0) return;
  ::kill(process_, SIGKILL);
  ::waitpid(process_, nullptr, 0);
  process_ = 0;
}

}  // namespace QVSa::test
