#include "IscsiUtil/IscsiTools.h"
#include "Messages.h"

namespace IscsiUtil {

using CoreCtl::Lib::CoreCtlException;
using CoreCtl::Storage::iScsiInterfaceImpl;
using CoreCtl::Storage::StorageInfoImpl;
using NodeCtl::Storage::ScsiInterface;

void IscsiTools::Refuse(const char* text, int line) {
  throw CoreCtlException(text, "plugins/iscsi/IscsiUtil", line, NodeCtl::Lib::NoticeMessage());
}

std::unique_ptr<NodeCtl::Storage::iScsiInterface> IscsiTools::GetIscsiInterface(
    const std::string& adapterName) {
  StorageInfoImpl storage;
  std::unique_ptr<ScsiInterface> found(storage.GetScsiInterface(adapterName));
  std::unique_ptr<iScsiInterface> adapter(dynamic_cast<iScsiInterfaceImpl*>(found.get()));
  if (!adapter) Refuse("Not iSCSI adapter.");
  static_cast<void>(found.release());  // the same object, now owned as what it is
  return adapter;
}

void IscsiTools::ProcessStatus(iScsiInterface* interface, iScsiStatus status,
                               boost::shared_ptr<Plinth::CallSpec::Output> output) {
  switch (status) {
    case iScsiStatus::RebootRequired:
      output->ReportError(TessaroCli::IscsiNamespace::RebootRequiredMessage);
      break;
    case iScsiStatus::ResetRequired:
      interface->ResetAdapter();
      break;
    case iScsiStatus::NotSupported:
      output->ReportError(TessaroCli::IscsiNamespace::OperationNotSupportedMessage);
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
