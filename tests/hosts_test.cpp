// The host descriptions that come with the program do what they are there for.
#include "support/Harness.h"
#include "support/ProjectFile.h"

namespace {

TEST(Hosts, OfOneThatFailsAListLeavesOutWhatItMay) {
  Harness host(FileText("hosts/faults.json"));
  for (const auto& [line, call] : {std::pair{"ipconfig get -A lacks", "IMA_TSR_GetLnpOidList"},
                                   {"list -A lacks", "IMA_TSR_GetNicProperties"}}) {
    const Outcome run = host(std::string("iscsi networkportal ") + line);
    EXPECT_EQ(run.status, 0);
    EXPECT_THAT(run.trace, testing::Contains(testing::HasSubstr(call)));
  }
  EXPECT_EQ(Harness(FileText("hosts/empty.json"))("iscsi adapter list").result, nlohmann::json::array());
}

}  // namespace
