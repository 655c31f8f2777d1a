#include <CoreCtl/Util.h>

#include "corectl/Operation.h"
#include "host/EnvironmentText.h"
#include "host/Storage.h"
#include "store/Rehearsal.h"

namespace CoreCtl::Util {

struct EnvironmentVarFile::State {
  std::string path;  // on the host
  host::EnvironmentText text;
};

EnvironmentVarFile::EnvironmentVarFile(std::string path) : state_(std::make_unique<State>()) {
  state_->path = std::move(path);
}

EnvironmentVarFile::~EnvironmentVarFile() = default;

void EnvironmentVarFile::Parse() {
  corectl::Outside(host::Call::OnHost("Parse", {state_->path}), [&] {
    const std::string file = host::HostPath(state_->path);
    std::string contents;
    host::ReadHostFile(file, contents);
    try {
      state_->text.Parse(contents);
    } catch (const host::Error& error) {
      throw host::Error(error.GetKind(), "The file " + file + " cannot be understood: " + error.what() + ".");
    }
  });
}

void EnvironmentVarFile::Set(std::string name, std::string value) {
  try {
    state_->text.Set(name, value);
  } catch (const host::Error& error) {
    corectl::Throw(error, host::Call::Style::Operation);
  }
}

void EnvironmentVarFile::Save() {
  corectl::Outside(host::Call::OnHost("Save", {state_->path}), [&] {
    const std::string path = host::HostPath(state_->path);
    struct stat old;
    const bool exists = host::IsRegularFile("The file", path, old);
    if (host::Rehearsal* rehearsal = host::Rehearsal::Current()) {
      return rehearsal->WriteFile(path, state_->text.Text());
    }
    host::Host::Current().Settle();
    host::MakeFoldersFor(path);
    host::NewFile file(path);
    file.Write(state_->text.Text());
    if (exists) file.SetOwnerAndMode(old.st_uid, old.st_gid, old.st_mode);
    file.Replace();
  });
}

}  // namespace CoreCtl::Util
