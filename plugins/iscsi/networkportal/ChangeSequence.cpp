#include "networkportal/ChangeSequence.h"

namespace TessaroCli::IscsiNamespace {

using NodeCtl::Lib::NodeCtlException;

void ChangeSequence::Run(Row row, const Plinth::CallSpec::Input& input, const char* failureText) {
  try {
    const bool whole = row(input, adapter_, *this);
    ResetIfRequired();
    if (whole) PostText(output_, reboots_.str());
  } catch (const NodeCtlException& failure) {
    Report(output_, ReportingThenReason(failureText), failure);
    try {
      ResetIfRequired();
    } catch (const NodeCtlException& ofReset) {
      output_->ReportError(ofReset.GetDescription(0));
    }
  }
}

}  // namespace TessaroCli::IscsiNamespace
