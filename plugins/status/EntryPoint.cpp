#include "status/Status.h"

extern "C" __attribute__((visibility("default"))) void AutoCli_RegisterNamespaces(
    boost::shared_ptr<Plinth::AutoCli::Namespace> parent) {
  parent->RegisterNamespaceNode(TessaroCli::Status::NewStatus(), "status");
}
