#include "status/Findings.h"

#include <algorithm>

#include "status/LoginStatus.h"

namespace TessaroCli::Status {

namespace {

using AdapterState = iScsiInterface::iScsiAdapterState;
using DiscoveryStatus = iScsiInterface::iScsiDiscoveryStatus;
using NodeCtl::Storage::iScsiChapType;

/// How many targets a line names.
constexpr std::size_t kMostNamed = 3;

/// "1 session", "2 sessions".
std::string Counted(std::size_t count, const std::string& what) {
  return std::to_string(count) + ' ' + what + (count == 1 ? "" : "s");
}

/// As a word for a shell.
std::string ShellWord(const std::string& text) {
  constexpr char kPlain[] = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789_-.:,/@";
  if (!text.empty() && text.find_first_not_of(kPlain) == text.npos) return text;
  std::string quoted = "'";
  for (const char byte : text) byte == '\'' ? quoted += "'\\''" : quoted += byte;
  return quoted + '\'';
}

std::string Closer(const AdapterSurvey& survey, const char* command) {
  return std::string("hcli iscsi ") + command + " --adapter " + ShellWord(survey.name);
}

/// The first few, each as @p text gives it, and how many more there are.
template <class Element, class Text>
std::string Named(const std::vector<Element>& elements, Text text) {
  std::string named;
  for (std::size_t i = 0; i < elements.size() && i < kMostNamed; ++i) {
    named += (i == 0 ? "" : ", ") + text(elements[i]);
  }
  if (elements.size() > kMostNamed) named += " and " + Counted(elements.size() - kMostNamed, "other");
  return named;
}

std::string ChapText(const std::optional<iScsiChapType>& level) {
  if (!level) return "unknown";
  switch (*level) {
    case iScsiChapType::Prohibited:
      return "prohibited";
    case iScsiChapType::Discouraged:
      return "discouraged";
    case iScsiChapType::Preferred:
      return "preferred";
    case iScsiChapType::Required:
      return "required";
  }
  return "unknown";
}

const char* StateText(const AdapterSurvey& survey) {
  if (survey.state == AdapterState::Online) return "online";
  if (survey.state == AdapterState::Offline) return "offline";
  return survey.state == AdapterState::Unbound ? "unbound" : "in an unknown state";
}

FindingState StateOf(const AdapterSurvey& survey) {
  if (survey.state == AdapterState::Online) return FindingState::Ok;
  return survey.state == AdapterState::Offline ? FindingState::Fault : FindingState::Warning;
}

std::string ConnectionText(const AdapterSurvey& survey) {
  if (!survey.hasTargets) return "its targets cannot be read";
  const std::size_t targets = survey.connected.size() + survey.unconnected.size();
  if (targets == 0) return "no targets";
  return Counted(survey.sessions, "session") + " with " + std::to_string(survey.connected.size()) + " of " +
         Counted(targets, "target");
}

std::string TargetsText(const AdapterSurvey& survey) {
  std::string text = Named(survey.connected, [](const NamedTarget& target) {
    return target.name + (target.count == 1 ? "" : " (" + Counted(target.count, "session") + ")");
  });
  if (!survey.unconnected.empty()) {
    text += (text.empty() ? "not connected: " : "; not connected: ") +
            Named(survey.unconnected, [](const std::string& name) { return name; });
  }
  return text;
}

/// "online, 2 sessions with 1 of 2 targets, CHAP required".
std::string AdapterText(const AdapterSurvey& survey) {
  std::string text = std::string(StateText(survey)) + ", " + ConnectionText(survey);
  text += ", CHAP " + ChapText(survey.chap);
  if (survey.mutualChap != iScsiChapType::Prohibited) text += ", mutual CHAP " + ChapText(survey.mutualChap);
  return text;
}

Line AdapterLine(const AdapterSurvey& survey) {
  Line line{StateOf(survey), survey.name, "adapter", survey.sessions};
  line.finding = AdapterText(survey);
  line.detail = survey.description;
  if (!survey.driver.empty()) line.detail += (line.detail.empty() ? "driver " : ", driver ") + survey.driver;
  line.targets = TargetsText(survey);
  if (survey.sessions > 0) {
    line.closer = Closer(survey, "session list");
  } else if (!survey.unconnected.empty()) {
    line.closer = Closer(survey, "adapter target list");
  } else if (line.state != FindingState::Ok) {
    line.closer = Closer(survey, "adapter get");
  }
  return line;
}

/// What is wrong with the adapter's targets.
void AddTargetLines(const AdapterSurvey& survey, std::vector<Line>& lines) {
  if (!survey.refused.empty()) {
    // The last login can have been one more, beside those that worked.
    const bool isOut = std::any_of(survey.refused.begin(), survey.refused.end(),
                                   [](const NamedTarget& target) { return target.count == 0; });
    Line& line = lines.emplace_back();
    line = {isOut ? FindingState::Fault : FindingState::Warning, survey.name, "login", survey.refused.size()};
    line.finding = "the last login to " + Counted(survey.refused.size(), "target") + " failed";
    line.targets = Named(survey.refused, [](const NamedTarget& target) {
      return target.name + ": " + LoginStatusText(target.loginStatus);
    });
    line.closer = Closer(survey, "adapter target list");
  }
  if (!survey.broken.empty()) {
    std::size_t count = 0;
    for (const NamedTarget& target : survey.broken) count += target.count;
    Line& line = lines.emplace_back();
    line = {FindingState::Fault, survey.name, "connection", count};
    line.finding = Counted(count, "connection") + (count == 1 ? " is" : " are") + " not logged in";
    line.targets = Named(survey.broken, [](const NamedTarget& target) { return target.name; });
    line.closer = Closer(survey, "session connection list");
  }
}

void AddDiscoveryLine(const AdapterSurvey& survey, std::vector<Line>& lines) {
  if (!survey.discovery || survey.discovery == DiscoveryStatus::Completed) return;
  const bool isRefused = survey.discovery == DiscoveryStatus::CompletedWithFailedLogins;
  if (isRefused && !survey.refused.empty()) return;  // they are told one by one
  Line& line = lines.emplace_back();
  line = {FindingState::Warning, survey.name, "discovery", 1};
  line.finding = "how the last discovery ended is unknown";
  if (isRefused) line.finding = "a login of the last discovery failed";
  if (survey.discovery == DiscoveryStatus::Timeout)
    line.finding = "a portal did not answer the last discovery";
  line.closer = Closer(survey, "adapter discovery status get");
}

Line SummaryLine(const std::vector<AdapterSurvey>& surveys, const std::vector<Line>& lines) {
  std::size_t sessions = 0;
  std::size_t connected = 0;
  std::size_t targets = 0;
  for (const AdapterSurvey& survey : surveys) {
    sessions += survey.sessions;
    connected += survey.connected.size();
    targets += survey.connected.size() + survey.unconnected.size();
  }
  const auto count = [&](FindingState state) {
    return static_cast<std::size_t>(
        std::count_if(lines.begin(), lines.end(), [&](const Line& line) { return line.state == state; }));
  };
  const std::size_t faults = count(FindingState::Fault);
  const std::size_t warnings = count(FindingState::Warning);
  FindingState state = surveys.empty() || warnings > 0 ? FindingState::Warning : FindingState::Ok;
  if (faults > 0) state = FindingState::Fault;
  Line line{state, "host", "summary", faults + warnings};
  line.finding = surveys.empty()
                     ? "no iSCSI adapter"
                     : Counted(surveys.size(), "adapter") + ", " + Counted(sessions, "session") + " with " +
                           std::to_string(connected) + " of " + Counted(targets, "target");
  if (faults > 0) line.finding += ", " + Counted(faults, "fault");
  if (warnings > 0) line.finding += ", " + Counted(warnings, "warning");
  line.closer = surveys.empty() ? "hcli iscsi software get" : "hcli iscsi adapter list";
  return line;
}

}  // namespace

std::vector<Line> LinesOf(const std::optional<std::vector<AdapterSurvey>>& surveys,
                          const std::vector<Plinth::Finding>& waiting) {
  if (!surveys) {
    Line line{FindingState::Fault, "host", "summary", 1, "the adapters cannot be listed"};
    line.closer = "hcli doctor";
    return {line};
  }
  std::vector<Line> lines;
  for (const AdapterSurvey& survey : *surveys) {
    if (!survey.unread.empty()) {
      Line& line = lines.emplace_back();
      line = {FindingState::Fault, survey.name, "unread", survey.unread.size(), "not all of it can be read"};
      line.detail = survey.unread.front();
      line.closer = "hcli doctor";
    }
    AddTargetLines(survey, lines);
    AddDiscoveryLine(survey, lines);
    lines.push_back(AdapterLine(survey));
  }
  for (const Plinth::Finding& finding : waiting) {
    Line& line = lines.emplace_back();
    line = {finding.state, finding.check.empty() ? "host" : finding.check, "pending", 1, finding.seen};
    line.closer = finding.mend;
  }
  std::stable_sort(lines.begin(), lines.end(),
                   [](const Line& one, const Line& other) { return one.state > other.state; });
  lines.insert(lines.begin(), SummaryLine(*surveys, lines));
  return lines;
}

}  // namespace TessaroCli::Status
