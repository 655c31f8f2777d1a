#include "IscsiUtil/IscsiTools.h"
#include "IscsiUtil/Refusal.h"
#include "Messages.h"

namespace IscsiUtil {

using CoreCtl::Storage::iScsiInterfaceImpl;
using CoreCtl::Storage::StorageInfoImpl;
using NodeCtl::Storage::ScsiInterface;

std::unique_ptr<NodeCtl::Storage::iScsiInterface> IscsiTools::GetIscsiInterface(
    const std::string& adapterName) {
  StorageInfoImpl storage;
  std::unique_ptr<ScsiInterface> found(storage.GetScsiInterface(adapterName));
  auto* const adapter = dynamic_cast<iScsiInterfaceImpl*>(found.get());
  if (adapter == nullptr) {
    found.reset();  // gone by the time that the refusal is caught
    Refuse("Not iSCSI adapter.");
  }
  static_cast<void>(found.release());
  return std::unique_ptr<iScsiInterface>(adapter);
}

void IscsiTools::ProcessStatus(iScsiInterface* interface, iScsiStatus status,
                               boost::shared_ptr<Plinth::CallSpec::Output> output) {
  switch (status) {
    case iScsiStatus::RebootRequired:
      output->ReportError(TessaroCli::RebootRequiredMessage);
      break;
    case iScsiStatus::ResetRequired:
      interface->ResetAdapter();
      break;
    case iScsiStatus::NotSupported:
      output->ReportError(TessaroCli::OperationNotSupportedMessage);
      break;
    default:
      break;
  }
}

bool IscsiTools::IsResetRequired(const std::string& option, iScsiStatus status,
                                 std::basic_stringstream<char>& messages) {
  if (status == iScsiStatus::RebootRequired) {
    if (option.empty()) {
      messages << "Reboot required. ";
    } else {
      messages << "Reboot required for operation '" << option << "'. ";
    }
  }
  return status == iScsiStatus::ResetRequired;
}

}  // namespace IscsiUtil
