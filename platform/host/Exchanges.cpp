#include "host/Exchanges.h"

#include <algorithm>

#include "host/Storage.h"
#include "store/Rehearsal.h"

namespace host {

namespace {

/// How often others may change what an operation was planned by, before it gives up.
constexpr int kMostDisturbances = 3;

}  // namespace

Exchanges::~Exchanges() {
  for (const auto& login : logins_) End(login);
}

void Exchanges::End(const Asked<LoginRequest, LoginAnswer>& login) noexcept try {
  if (!login.isAnswered || login.reply.status != kDone) return;
  const LoginRequest& request = login.question;
  network_->Logout({.initiator = request.initiator,
                    .target = request.target,
                    .isid = request.isid,
                    .tsih = login.reply.tsih,
                    .session = login.reply.session});
} catch (const std::exception&) {
  // It stays, and is shown where the machine tells of its sessions.
}

template <class Question, class Reply>
Reply Exchanges::ReplyTo(std::vector<Asked<Question, Reply>>& all, const Question& question) {
  for (Asked<Question, Reply>& asked : all) {
    if (asked.isUsed || asked.question != question) continue;
    asked.isUsed = true;
    return asked.reply;
  }
  Reply reply;
  reply.status = kNotAsked;
  if (Rehearsal::Current() == nullptr) all.push_back({question});
  return reply;
}

SendTargetsAnswer Exchanges::SendTargets(const Request& request) {
  return DoesWait() ? ReplyTo(discoveries_, request) : network_->SendTargets(request);
}

LoginAnswer Exchanges::Login(const LoginRequest& request) {
  return DoesWait() ? ReplyTo(logins_, request) : network_->Login(request);
}

void Exchanges::Logout(const LogoutRequest& request) {
  if (DoesWait()) {
    ReplyTo(logouts_, request);
  } else {
    network_->Logout(request);
  }
}

bool Exchanges::ArePlanned() const {
  const auto isPlanned = [](const auto& asked) { return !asked.isAnswered; };
  return std::any_of(logouts_.begin(), logouts_.end(), isPlanned) ||
         std::any_of(discoveries_.begin(), discoveries_.end(), isPlanned) ||
         std::any_of(logins_.begin(), logins_.end(), isPlanned);
}

bool Exchanges::EndUnused() noexcept {
  const auto isUnused = [](const auto& asked) { return !asked.isUsed; };
  for (const auto& login : logins_) {
    if (isUnused(login)) End(login);
  }
  const std::size_t count = std::erase_if(logins_, isUnused) + std::erase_if(discoveries_, isUnused) +
                            std::erase_if(logouts_, isUnused);
  return count != 0;
}

void Exchanges::Perform() {
  if (EndUnused() && ++disturbances_ > kMostDisturbances) {
    throw Error(Error::Kind::Busy,
                "Others changed what the operation goes by each time that the network was asked.");
  }
  // A session that is to go makes room for the one that comes in its place.
  for (auto& logout : logouts_) {
    if (!logout.isAnswered) network_->Logout(logout.question);
    logout.isAnswered = true;
    logout.isUsed = false;
  }
  for (auto& discovery : discoveries_) {
    if (!discovery.isAnswered) discovery.reply = network_->SendTargets(discovery.question);
    discovery.isAnswered = true;
    discovery.isUsed = false;
  }
  for (auto& login : logins_) {
    if (!login.isAnswered) login.reply = network_->Login(login.question);
    login.isAnswered = true;
    login.isUsed = false;
  }
}

void Exchanges::Keep() noexcept {
  EndUnused();
  logins_.clear();
}

}  // namespace host
