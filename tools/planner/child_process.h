// Work in a process of its own, for code that keeps state as long as its process lives or that may
// end it.
#pragma once

#include <sys/types.h>

#include <functional>
#include <string>

namespace image {

struct ChildAnswer {
  int status = 0;  // that the process ended with; -1 when a signal ended it
  std::string output;
};

class ChildProcess {
 public:
  // Returns the status to end with. What it throws makes the text the output, and kFailed the
  // status.
  using Work = std::function<int(const std::string& input, std::string* output)>;
  static constexpr int kFailed = 99;

  // The process is made at once, with what this one holds now, and begins its work when it is
  // asked. It ends with this one. Throws std::runtime_error when the host can't make it.
  explicit ChildProcess(const Work& work);
  ~ChildProcess();
  ChildProcess(const ChildProcess&) = delete;
  ChildProcess& operator=(const ChildProcess&) = delete;

  // Lets it work, and waits for its end. Once.
  ChildAnswer Ask(const std::string& input = {});

 private:
  int Wait();

  pid_t process_ = -1;  // -1: waited for
  int input_ = -1;
  int output_ = -1;
};

// The descriptor's bytes up to its end.
std::string ReadToEnd(int descriptor);

}  // namespace image
