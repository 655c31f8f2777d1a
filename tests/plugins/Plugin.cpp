/// Built once for each name under which the loader is tried.
#include <Plinth/AutoCli.h>

#include <stdexcept>

#define TEXT_OF(name) #name
#define AS_TEXT(name) TEXT_OF(name)

#ifdef HCLI_PLUGIN_NODE
extern "C" __attribute__((visibility("default"))) void AutoCli_RegisterNamespaces(
    boost::shared_ptr<Plinth::AutoCli::Namespace> parent) {
  const auto node = Plinth::AutoCli::Namespace::New();
  node->SetDescription(AS_TEXT(HCLI_PLUGIN_FILE));
  parent->RegisterNamespaceNode(node, AS_TEXT(HCLI_PLUGIN_NODE));
#ifdef HCLI_PLUGIN_THROWS
  throw std::runtime_error("out of order");
#endif
}
#endif
