#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    ChapDirection("The iSCSI CHAP authentication direction. Options are:%ENUM%"),
    StringOption("authname", 'N', "The iSCSI CHAP authentication name"),
    StringOption("secret", 'S', "The iSCSI CHAP authentication secret").Sensitive(),
    ChapLevel("The iSCSI CHAP authentication level. Options are:%ENUM%"),
    FlagOption("default", 'D', "Resetting iSCSI CHAP authenthication setting to default."),
};

}  // namespace

class AdapterAuthChapSet : public CommandFrame<AdapterAuthChapSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI CHAP authentication for the iSCSI Host Bus Adapter.",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    constexpr char kFailure[] = "Failed to set iSCSI CHAP authentication configuration.";
    WithAdapter(input, output, Reporting(kFailure), [&](iScsiInterface& adapter) {
      const std::string word = input->GetString("direction");
      const auto entry = ChapEntryFrom(input, output);
      if (!entry) return;
      const auto direction = ChapDirectionFrom(word, output);
      if (!direction) return;
      if (*direction == ChapUni) {
        adapter.SetChapParameters(*entry, ChapUni);
        // Mutual CHAP cannot stand without CHAP.
        if (entry->level == iScsiChapType::Prohibited) adapter.SetChapParameters(ClearedChap(), ChapMutual);
      } else {
        if (!IsMutualLevel(entry->level, output)) return;
        iScsiChapParameters uni;
        adapter.GetChapParameters(uni, ChapUni);
        if (!MayStandOver(uni.level, entry->level, output)) return;
        adapter.SetChapParameters(*entry, ChapMutual);
      }
      PostSuccess(output);
    });
  }
};

template NodePtr Make<AdapterAuthChapSet>();

}  // namespace TessaroCli::IscsiNamespace
