#include "session/SessionChange.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("name", 'n', "The name of the target to login to."),
    SessionIsid(),
};

}  // namespace

class SessionRemove : public CommandFrame<SessionRemove> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Logout sessions on current iSCSI configuration.",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ChangeSessions(input, output, "Failed to remove session.", IMA_TSR_RemoveSession);
  }
};

template NodePtr Make<SessionRemove>();

}  // namespace TessaroCli::IscsiNamespace
