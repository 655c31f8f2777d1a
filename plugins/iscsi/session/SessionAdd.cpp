#include "session/SessionChange.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    TargetFilter(),
    SessionIsid(),
};

}  // namespace

class SessionAdd : public CommandFrame<SessionAdd> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Login sessions on current iSCSI configuration.",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    ChangeSessions(input, output, "Failed to add session.",
                   [](const IMA_OID& oid) { return IMA_TSR_AddSession(oid, 0, 0, 0); });
  }
};

template NodePtr Make<SessionAdd>();

}  // namespace TessaroCli::IscsiNamespace
