#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <vector>

#include "plinth/Run.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

/// Files and texts made on other systems end their lines in CR LF.
void DropReturn(std::string& line) {
  if (!line.empty() && line.back() == '\r') line.pop_back();
}

/// The file that --secret-file names, open.
class SecretFile {
 public:
  explicit SecretFile(const std::string& path) : path_(path) {
    if (path == "-") {
      throw UsageError(
          "option --secret-file: \"-\" is no file; to read standard input, give \"-\" as the value of "
          "the secret's own option");
    }
    // Without waiting for somebody to open a pipe that has a name; the one of a shell's <(command) is open.
    file_ = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY);
    if (file_ < 0) Refuse(std::string("cannot be read: ") + std::strerror(errno));
    fcntl(file_, F_SETFL, 0);  // what is read there is waited for
  }
  SecretFile(const SecretFile&) = delete;
  SecretFile& operator=(const SecretFile&) = delete;
  ~SecretFile() {
    if (file_ >= 0) close(file_);
  }

  /// Throws where somebody else than its owner could read it, or has written it.
  void RequirePrivate() const {
    struct stat status = {};
    if (fstat(file_, &status) != 0) Refuse(std::string("cannot be read: ") + std::strerror(errno));
    if (!S_ISREG(status.st_mode) && !S_ISFIFO(status.st_mode)) Refuse("is neither a regular file nor a pipe");
    char fault[160];
    if (status.st_uid != 0 && status.st_uid != geteuid()) {
      std::snprintf(fault, sizeof fault,
                    "belongs to user %u; it has to belong to user %u, who runs this, or to root",
                    static_cast<unsigned>(status.st_uid), static_cast<unsigned>(geteuid()));
      Refuse(fault);
    }
    if ((status.st_mode & (S_IRWXG | S_IRWXO)) != 0) {
      std::snprintf(fault, sizeof fault,
                    "has mode %04o; it has to be its owner's alone, which mode 0600 makes it",
                    static_cast<unsigned>(status.st_mode & 07777));
      Refuse(fault);
    }
  }

  std::string FirstLine() const {
    constexpr std::size_t kMost = 65536;
    std::string line;
    std::array<char, 4096> bytes;
    while (line.size() <= kMost) {
      const ssize_t count = read(file_, bytes.data(), bytes.size());
      if (count < 0 && errno == EINTR) continue;
      if (count < 0) Refuse(std::string("cannot be read: ") + std::strerror(errno));
      line.append(bytes.data(), static_cast<std::size_t>(count));
      const std::size_t end = line.find('\n');
      if (count > 0 && end == line.npos) continue;
      line.resize(std::min(end, line.size()));
      DropReturn(line);
      if (line.empty()) Refuse("has nothing in its first line");
      return line;
    }
    Refuse("has more than " + std::to_string(kMost) + " bytes in its first line");
  }

 private:
  [[noreturn]] void Refuse(const std::string& why) const {
    throw UsageError("option --secret-file: " + Quoted(path_) + ' ' + why);
  }

  std::string path_;
  int file_ = -1;
};

std::vector<const Parameter*> SecretsOf(const OptionTable& options) {
  std::vector<const Parameter*> secrets;
  for (const Parameter& parameter : options.Parameters()) {
    if (parameter.sensitive) secrets.push_back(&parameter);
  }
  return secrets;
}

/// True for a command that says of itself that it changes nothing: its secrets are known already.
bool IsFetcher(const Run& run) {
  const std::string* type = FindValue(AutoCli::NodeData::Of(*run.request.node).metaData, "type");
  return type && *type == "fetcher";
}

std::string Ask(Run& run, const Parameter& parameter) {
  const auto read = [&](const std::string& question) {
    std::string line;
    if (!run.console.ReadSecret(question, line)) {
      throw UsageError(
          "option " + OptionName(parameter) + ": standard input ended before the value" +
          (run.line == 0 ? "" : "; lines of a batch that comes from there have none: give --secret-file"));
    }
    DropReturn(line);
    return line;
  };
  const std::string name = parameter.name + (run.line == 0 ? "" : " of line " + std::to_string(run.line));
  std::string value = read(name);
  // Nobody has seen what was typed.
  if (run.console.IsAsking() && !IsFetcher(run) && read(name + " again") != value) {
    throw UsageError("option " + OptionName(parameter) + ": the two values differ, and neither is set");
  }
  return value;
}

/// Secrets on a command line can be seen by all who may list processes.
void WarnOfSeen(Run& run) {
  if (!run.console.IsErrorTerminal() || IsQuiet(run) || run.line != 0) return;
  for (const Parameter* secret : SecretsOf(run.request.own)) {
    const std::vector<std::string>& texts = run.request.own.For(*secret).texts;
    if (texts.empty() || texts.front().empty() || texts.front() == "-") continue;
    run.console.Error().Write(
        "hcli: note: while this runs, others can see the value of " + OptionName(*secret) +
        " in the list of processes; --secret-file, or \"-\" as the value, keeps it to you.\n");
    run.console.Error().Flush();
    return;
  }
}

}  // namespace

void ExpectSecretFile(Run& run, const Given&) {
  OptionTable& own = run.request.own;
  const std::vector<const Parameter*> secrets = SecretsOf(own);
  if (secrets.empty()) {
    throw UsageError("option --secret-file: " + Quoted(run.request.path) + " takes no secret");
  }
  std::vector<std::string> names;
  names.reserve(secrets.size());
  for (const Parameter* secret : secrets) names.push_back(OptionName(*secret));
  if (names.size() > 1) {
    throw UsageError("option --secret-file: it could be the value of each of " + Join(names, ", ") +
                     "; give \"-\" as their values to have them read from standard input");
  }
  if (own.For(*secrets.front()).given) {
    throw UsageError("option --secret-file: " + names.front() + " is given too; give one of them");
  }
  const std::string toBeRead = "-";
  own.Take(*secrets.front(), &toBeRead);
}

void ReadSecrets(Run& run) {
  WarnOfSeen(run);
  const Given& given = run.request.global.For("secret-file");
  run.request.own.ReadSecrets([&](const Parameter& parameter) {
    if (!given.given) return Ask(run, parameter);
    const SecretFile file(given.texts.front());
    file.RequirePrivate();
    return file.FirstLine();
  });
}

}  // namespace Plinth
