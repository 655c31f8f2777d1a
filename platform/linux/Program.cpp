#include "linux/Program.h"

#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <spawn.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstring>

#include "host/Storage.h"

namespace linux {

namespace {

using Clock = std::chrono::steady_clock;
constexpr std::size_t kMostBytes = std::size_t{16} << 20U;

/// The reading end of a pipe, and the end that a program writes to.
class Pipe {
 public:
  Pipe() {
    if (pipe2(ends_.data(), O_CLOEXEC) != 0)
      throw host::Error(host::Error::KindOfSystem(errno),
                        std::string("No pipe can be made: ") + strerror(errno) + ".");
  }
  Pipe(const Pipe&) = delete;
  Pipe& operator=(const Pipe&) = delete;
  ~Pipe() {
    CloseWriter();
    close(ends_[0]);
  }
  int Reader() const { return ends_[0]; }
  int Writer() const { return ends_[1]; }
  void CloseWriter() {
    if (ends_[1] >= 0) close(ends_[1]);
    ends_[1] = -1;
  }

 private:
  std::array<int, 2> ends_{-1, -1};
};

pid_t Start(const std::string& path, std::vector<std::string>& words, const Pipe& output,
            const Pipe& complaints) {
  std::vector<char*> arguments;
  arguments.reserve(words.size() + 1);
  for (std::string& word : words) arguments.push_back(word.data());
  arguments.push_back(nullptr);
  std::string locale = "LC_ALL=C";
  std::string folders = "PATH=/usr/sbin:/usr/bin:/sbin:/bin";
  char* environment[] = {locale.data(), folders.data(), nullptr};
  posix_spawn_file_actions_t files;
  posix_spawn_file_actions_init(&files);
  posix_spawn_file_actions_addopen(&files, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
  posix_spawn_file_actions_adddup2(&files, output.Writer(), STDOUT_FILENO);
  posix_spawn_file_actions_adddup2(&files, complaints.Writer(), STDERR_FILENO);
  // What this process ignores is no business of the other.
  posix_spawnattr_t attributes;
  posix_spawnattr_init(&attributes);
  sigset_t usual;
  sigemptyset(&usual);
  for (const int signal : {SIGPIPE, SIGXFSZ}) sigaddset(&usual, signal);
  posix_spawnattr_setsigdefault(&attributes, &usual);
  posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETSIGDEF);
  pid_t process = 0;
  const int error = posix_spawn(&process, path.c_str(), &files, &attributes, arguments.data(), environment);
  posix_spawnattr_destroy(&attributes);
  posix_spawn_file_actions_destroy(&files);
  if (error != 0) {
    throw host::Error(host::Error::KindOfSystem(error),
                      "The program " + path + " cannot be started: " + strerror(error) + ".");
  }
  return process;
}

/// False once there is nothing more to come.
bool Take(int reader, std::string& text) {
  char bytes[65536];
  const ssize_t count = read(reader, bytes, sizeof bytes);
  if (count < 0) return errno == EINTR;
  if (text.size() < kMostBytes) text.append(bytes, static_cast<std::size_t>(count));
  return count > 0;
}

}  // namespace

Ended RunProgram(std::vector<std::string> words, std::chrono::milliseconds limit) {
  const Clock::time_point end = Clock::now() + limit;
  Pipe output;
  Pipe complaints;
  const pid_t process = Start(host::HostPath(words.front()), words, output, complaints);
  output.CloseWriter();
  complaints.CloseWriter();
  Ended ended;
  const int ending = static_cast<int>(
      syscall(SYS_pidfd_open, process, 0));  // readable once the process has ended; what it started may go on
  pollfd waited[] = {{output.Reader(), POLLIN, 0}, {complaints.Reader(), POLLIN, 0}, {ending, POLLIN, 0}};
  std::string* texts[] = {&ended.output, &ended.complaints};
  for (bool hasEnded = false; !hasEnded;) {
    const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(end - Clock::now());
    if (left.count() <= 0 || ending < 0) {
      ended.timedOut = true;
      kill(process, SIGKILL);
      break;
    }
    if (poll(waited, 3, static_cast<int>(left.count())) <= 0) continue;
    // What an ended process has written is in the pipes in full: one more look takes it.
    hasEnded = waited[2].revents != 0;
    for (std::size_t i = 0; i < 2; ++i) {
      pollfd& pipe = waited[i];
      while (pipe.fd >= 0 && poll(&pipe, 1, 0) > 0) {
        if (!Take(pipe.fd, *texts[i])) pipe.fd = -1;
      }
    }
  }
  if (ending >= 0) close(ending);
  int status = 0;
  while (waitpid(process, &status, 0) < 0 && errno == EINTR) {
  }
  ended.status = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
  return ended;
}

}  // namespace linux
