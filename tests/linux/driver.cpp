/// Runs one operation of the network that open-iscsi is, for tests: a JSON document on standard input says
/// which, and its answer is one on standard output.

#include <iostream>
#include <nlohmann/json.hpp>

#include "host/Storage.h"
#include "linux/Machine.h"
#include "linux/OpenIscsi.h"

namespace {

using nlohmann::json;

host::ChapEntry Chap(const json& given, const char* direction) {
  if (!given.contains(direction)) return {};
  return {given.value("demand", host::Demand::Required), given[direction][0], given[direction][1]};
}

template <class Request>
Request Common(const json& given) {
  Request request;
  request.adapter = "hba0";
  request.way = given.value("way", "");
  request.conduct = {3, 64, 9, 8, 7, 6, 45};
  request.initiator = "iqn.2026-11.org.example:hba0";
  request.from = given.value("from", "");
  request.portal = {given["host"], given["port"]};
  request.chap = {Chap(given, "uni"), Chap(given, "mutual")};
  return request;
}

json Shown(const host::Answer& answer) {
  json shown = {{"status", answer.status}};
  if (answer.movedTo) shown["movedTo"] = {answer.movedTo->host, answer.movedTo->port};
  return shown;
}

json SendTargets(linux::OpenIscsi& network, const json& given) {
  const host::SendTargetsAnswer answer = network.SendTargets(Common<host::Request>(given));
  json shown = Shown(answer);
  for (const host::FoundTarget& target : answer.targets) {
    for (const host::FoundPortal& found : target.portals)
      shown["targets"][target.name].push_back({found.portal.host, found.portal.port, found.tag});
  }
  return shown;
}

json Login(linux::OpenIscsi& network, const json& given) {
  auto request = Common<host::LoginRequest>(given);
  request.target = given["target"];
  request.offer.headerDigest = given.value("headerDigest", host::Demand::Prohibited);
  request.offer.firstBurstLength = given.value("firstBurstLength", request.offer.firstBurstLength);
  const host::LoginAnswer answer = network.Login(request);
  json shown = Shown(answer);
  shown.update({{"tsih", answer.tsih}, {"chap", answer.chap}, {"firstBurst", answer.offer.firstBurstLength}});
  return shown;
}

json Run(const json& given) {
  linux::OpenIscsi network(linux::Milliseconds(given.value("limit", 20000)));
  if (given["operation"] == "login") return Login(network, given);
  if (given["operation"] == "logout")
    network.Logout(
        {"iqn.2026-11.org.example:hba0", given["target"], {}, 0, linux::IdOfSession(given["session"])});
  return given["operation"] == "logout" ? json::object() : SendTargets(network, given);
}

}  // namespace

int main() {
  try {
    std::cout << Run(json::parse(std::cin)) << '\n';
  } catch (const host::Error& error) {
    std::cout << json{{"code", error.Code()}, {"error", error.what()}} << '\n';
  }
}
