// iscsi adapter firmware get and set: the adapter behind a name, the image files, and what a download
// changes.
#include <sys/stat.h>

#include <fstream>

#include "host/Storage.h"
#include "ima/FirmwareImage.h"
#include "support/Harness.h"

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kHost[] = R"({"softwareIscsi": {"enabled": false}, "adapters": [
  {"name": "hba0", "kind": "software"},
  {"name": "hba1", "physicalAdapter": "card", "download": {"firmwareSupported": 0, "optionRomSupported": 2},
   "properties": {"model": "M1", "firmwareVersion": "1.0", "optionRomVersion": "1.0"}},
  {"name": "hba2", "physicalAdapter": "card"},
  {"name": "hba3", "download": {"firmwareSupported": 0}},
  {"name": "hba4", "download": {"fileSupported": 0}},
  {"name": "hba5", "download": {"optionRomSupported": 0}}]})";

constexpr char kMagic[] = "ISCSI-ADAPTER-IMAGE 1\n";

/// An image file in a folder of its own.
class Image {
 public:
  explicit Image(const std::string& contents, const std::string& name = "image")
      : path_(root_.Path() + '/' + name) {
    std::ofstream(path_) << contents;
  }
  static std::string Of(const std::string& type, const std::string& more = "") {
    return kMagic + ("type: " + type + "\nversion: 2.0\n" + more + "length: 3\nabc");
  }
  const std::string& Path() const { return path_; }
  std::string On(const std::string& verb, const std::string& adapter) const {
    return "iscsi adapter firmware " + verb + " -A " + adapter + " -f '" + path_ + '\'';
  }

 private:
  TemporaryRoot root_;
  std::string path_;
};

TEST(Firmware, ImagesAreShownAndDownloadedByType) {
  const struct {
    const char* type;
    std::string adapter;
    const char* refusal;
    const char* versions;  // of firmware, option ROM and boot code afterwards
    const char* shown = type;
  } cases[] = {
      {"firmware", "hba1", nullptr, "2.0 1.0 - "},  // whatever the adapter says it takes
      {"bootcode", "hba1", nullptr, "1.0 1.0 2.0 "},
      {"option rom", "hba1", "OptionRom download not supported.", "1.0 1.0 - "},
      {"all", "hba1", "All download not supported.", "1.0 1.0 - "},
      {"all", "hba3", nullptr, "2.0 2.0 2.0 "},  // one kind is enough
      {"all", "hba5", nullptr, "2.0 2.0 2.0 "},
      {"option rom", "hba3", nullptr, "- 2.0 - "},
      {"-2147483648", "hba3", "Invalid download file type.", "- - - ", "unknown"},
  };
  for (const auto& [type, adapter, refusal, versions, shown] : cases) {
    SCOPED_TRACE(type + (" on " + adapter));
    Harness host(kHost);
    const Image image(Image::Of(type, "description: Dé\nupgrade: false\n"));
    EXPECT_EQ(host(image.On("get", adapter)).result, (nlohmann::json{{{"File", image.Path()},
                                                                      {"Type", shown},
                                                                      {"Version", "2.0"},
                                                                      {"Description", "Dé"},
                                                                      {"Upgrade", "false"}}}));
    const Outcome set = host(image.On("set", adapter));
    const bool done = refusal == nullptr;
    EXPECT_EQ(set.messages, done ? std::vector<std::string>{} : std::vector<std::string>{refusal});
    EXPECT_EQ(set.result, done ? nlohmann::json(true) : nullptr);
    EXPECT_EQ(set.Calls().back(), done ? "IMA_PhbaDownload" : "IMA_IsPhbaDownloadFile");
    std::string found;
    for (const char* key :
         {"/properties/firmwareVersion", "/properties/optionRomVersion", "/download/bootcodeVersion"}) {
      const std::string version = host.Show("/adapters/" + adapter.substr(3) + key);
      found += (version.empty() ? "-" : version) + ' ';
    }
    EXPECT_EQ(found, versions);
  }
}

TEST(Firmware, GoesToThePhysicalAdapterBehindTheName) {
  Harness host(kHost);
  const Image image(Image::Of("firmware", "upgrade: 2\nmodel: M1\n"), "im äge");
  const Outcome get = host(image.On("get", "hba2"));
  EXPECT_EQ(get.result[0]["File"], image.Path());
  EXPECT_EQ(get.result[0]["Upgrade"], "unknown");
  EXPECT_EQ(get.result[0]["Description"], "");
  // The software adapter is off: its physical adapter has no logical one and is passed over.
  EXPECT_THAT(get.Calls(),
              ElementsAre("IMA_GetPhbaOidList", "IMA_TSR_GetLhbaOidList", "IMA_TSR_GetLhbaOidList",
                          "IMA_GetLhbaProperties", "IMA_GetLhbaProperties", "IMA_GetPhbaDownloadProperties",
                          "IMA_IsPhbaDownloadFile"));
  EXPECT_EQ(host(image.On("set", "hba2")).result, true);
  for (const char* adapter : {"/adapters/1", "/adapters/2"}) {
    EXPECT_EQ(host.Show(adapter)["properties"]["firmwareVersion"], "2.0") << adapter;
  }
  const Image any(Image::Of("all"));
  EXPECT_THAT(host(any.On("get", "hba0")).messages, ElementsAre("Invalid adapter provided."));
  // Another model, and an adapter that takes no images.
  EXPECT_THAT(host(image.On("get", "hba3")).messages, ElementsAre("Invalid file provided."));
  EXPECT_THAT(host(any.On("set", "hba4")).messages, ElementsAre("Invalid download file provided."));
}

TEST(Firmware, TextsAreShownAsLongAsTheRecordHoldsThem) {
  const auto faces = [](int count) {
    std::string text;
    while (count-- > 0) text += "\xf0\x9f\x98\x80";  // four bytes, the most that a character takes
    return text;
  };
  const Image image(std::string(kMagic) + "type: all\nversion: " + faces(40) +
                    "\ndescription: " + faces(600) + "\nlength: 0\n");
  const nlohmann::json row = Harness(kHost)(image.On("get", "hba3")).result[0];
  EXPECT_EQ(row["Version"], faces(31));
  EXPECT_EQ(row["Description"], faces(511));
}

TEST(Firmware, TheFileIsNamedInUtf8) {
  for (const char* verb : {"get", "set"}) {
    const Outcome run = Harness(kHost)({"iscsi", "adapter", "firmware", verb, "-A", "hba1", "-f", "\xff"});
    EXPECT_THAT(run.messages, ElementsAre("Filename conversion failed."));
    EXPECT_THAT(run.trace, IsEmpty());
  }
}

/// Why the image is refused; empty when it is not.
std::string Refusal(const std::string& path) {
  try {
    ima::ReadFirmwareImage(path);
    return "";
  } catch (const host::Error& error) {
    const std::string text = error.what();
    EXPECT_THAT(text, testing::HasSubstr(path));
    return text.substr(text.rfind(": ") + 2);
  }
}

TEST(FirmwareImage, OnlyAWholeImageIsOne) {
  const std::string head = std::string(kMagic) + "type: all\nversion: 1\n";
  const std::pair<std::string, const char*> cases[] = {
      {"", "it does not begin with the line of an image."},
      {"ISCSI-ADAPTER-IMAGE 2\n" + Image::Of("all"), "it does not begin with the line of an image."},
      {kMagic, "its header is cut off."},
      {head + "length: 3\nab", "it is not as long as its header says."},
      {head + "length: 3\nabcd", "it is not as long as its header says."},
      {head + "length: 18446744073709551616\n", "its length is no number."},
      {head + "colour: red\nlength: 0\n", "red\"."},
      {head + "type: all\nlength: 0\n", "its header has two lines \"type\"."},
      {head + std::string(9000, 'x'), "its header is cut off."},
      {std::string(kMagic) + "version: 1\nlength: 0\n", "its type is none."},
      {std::string(kMagic) + "type: all\nlength: 0\n", "it has no version."},
      {head + "upgrade: yes\nlength: 0\n", "its upgrade mark is none."},
      {head + "description: \xff\nlength: 0\n", "its texts are not UTF-8."},
      {head + "length: 0\n", ""},
  };
  for (const auto& [contents, refusal] : cases)
    EXPECT_EQ(Refusal(Image(contents).Path()), refusal) << contents;

  TemporaryRoot root;
  EXPECT_EQ(Refusal(root.Path()), "it is no file.");
  EXPECT_EQ(Refusal(root.Path() + "/none"), "No such file or directory.");
  const std::string pipe = root.Path() + "/pipe";
  ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
  EXPECT_EQ(Refusal(pipe), "it is no file.");  // and nobody waits for a writer
}

}  // namespace
