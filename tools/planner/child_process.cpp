#include "tools/planner/child_process.h"

#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <csignal>
#include <stdexcept>
#include <string_view>

#include "tools/image/bad_input.h"

namespace image {
namespace {

struct Pipe {
  Pipe() {
    if (pipe(ends.data()) != 0)
      throw std::runtime_error("no pipe: " + SystemReason(LastCallError()));
  }
  std::array<int, 2> ends = {};  // to read, to write
};

void WriteAll(int descriptor, std::string_view bytes) {
  while (!bytes.empty()) {
    const ssize_t count = write(descriptor, bytes.data(), bytes.size());
    if (count <= 0) return;  // nobody is there to read it
    bytes.remove_prefix(static_cast<size_t>(count));
  }
}

[[noreturn]] void Serve(const ChildProcess::Work& work, int input, int output) {
  std::string text;
  int status = ChildProcess::kFailed;
  try {
    status = work(ReadToEnd(input), &text);
  } catch (const std::exception& error) {
    text = error.what();
  }
  WriteAll(output, text);
  _exit(status);  // buffers that were copied with the process are not this one's to write
}

}  // namespace

std::string ReadToEnd(int descriptor) {
  std::string bytes;
  std::array<char, 4096> block;
  for (ssize_t count; (count = read(descriptor, block.data(), block.size())) != 0;) {
    if (count > 0)
      bytes.append(block.data(), static_cast<size_t>(count));
    else if (errno != EINTR)
      break;
  }
  return bytes;
}

ChildProcess::ChildProcess(const Work& work) {
  const Pipe input, output;
  const pid_t parent = getpid();
  process_ = fork();
  if (process_ < 0) throw std::runtime_error("no process: " + SystemReason(LastCallError()));
  if (process_ == 0) {
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (getppid() != parent) _exit(kFailed);
    close(input.ends[1]);
    close(output.ends[0]);
    Serve(work, input.ends[0], output.ends[1]);
  }
  close(input.ends[0]);
  close(output.ends[1]);
  input_ = input.ends[1];
  output_ = output.ends[0];
}

ChildProcess::~ChildProcess() {
  if (process_ < 0) return;
  kill(process_, SIGKILL);
  close(input_);
  close(output_);
  Wait();
}

ChildAnswer ChildProcess::Ask(const std::string& input) {
  WriteAll(input_, input);
  close(input_);
  ChildAnswer answer;
  answer.output = ReadToEnd(output_);
  close(output_);
  const int status = Wait();
  answer.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
  return answer;
}

int ChildProcess::Wait() {
  int status = 0;
  while (waitpid(process_, &status, 0) < 0 && errno == EINTR) {
  }
  process_ = -1;
  return status;
}

}  // namespace image
