/// What one operation asks of a network that makes it wait.
///
/// No exchange happens while a transaction is open. The operation's work runs as far as it gets without an
/// answer, and is undone; what it has asked for is exchanged; and it runs anew, with the answers at hand. So
/// all that the exchange was planned by is looked at again in the transaction that keeps its outcome: a
/// request that is asked as before gets its answer, and a session that nobody asks for any more is ended.
#pragma once

#include <memory>
#include <vector>

#include "host/Network.h"

namespace host {

/// Stands between the operation and its network. A request without an answer yet is answered with kNotAsked.
/// In a dry run that is all that ever comes.
class Exchanges final : public Network {
 public:
  explicit Exchanges(std::unique_ptr<Network> network) : network_(std::move(network)) {}
  /// Ends the sessions that were begun, unless Keep was called.
  ~Exchanges() override;

  bool DoesWait() const override { return network_->DoesWait(); }
  bool FindsWays() const override { return network_->FindsWays(); }
  SendTargetsAnswer SendTargets(const Request& request) override;
  LoginAnswer Login(const LoginRequest& request) override;
  void Logout(const LogoutRequest& request) override;

  /// True where the work has to run anew behind Perform.
  bool ArePlanned() const;
  /// Exchanges what was asked for and has no answer yet, and ends the sessions that the work did not ask for
  /// any more. An Error of the network; or (Busy) where the work was disturbed too often.
  void Perform();
  /// The work is stored: the sessions that it has asked for stay.
  void Keep() noexcept;

 private:
  template <class Question, class Reply>
  struct Asked {
    Question question;
    Reply reply = {};
    bool isAnswered = false;
    bool isUsed = true;  // by the work as it ran last
  };

  template <class Question, class Reply>
  Reply ReplyTo(std::vector<Asked<Question, Reply>>& all, const Question& question);
  void End(const Asked<LoginRequest, LoginAnswer>& login) noexcept;
  /// Forgets the answers that the work as it ran last had no use for, and ends the sessions among them. False
  /// where there were none.
  bool EndUnused() noexcept;

  std::unique_ptr<Network> network_;
  std::vector<Asked<LogoutRequest, Answer>> logouts_;
  std::vector<Asked<Request, SendTargetsAnswer>> discoveries_;
  std::vector<Asked<LoginRequest, LoginAnswer>> logins_;
  int disturbances_ = 0;
};

}  // namespace host
