#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

using NodeCtl::Lib::NodeCtlException;

void Report(const OutputPtr& output, const FailureReport& report, const NodeCtlException& failure) {
  using enum FailureReport::Reason;
  if (report.reason == First) output->ReportError(failure.GetDescription(0));
  output->ReportError(report.text);
  if (report.reason == Last) output->ReportError(failure.GetDescription(0));
}

std::unique_ptr<iScsiInterface> FindAdapter(const InputPtr& input, const OutputPtr& output) {
  try {
    return IscsiTools::GetIscsiInterface(input->GetString("adapter"));
  } catch (const NodeCtlException&) {
    output->ReportError(InvalidAdapterMessage);
    return nullptr;
  }
}

void Post(const OutputPtr& output, const boost::shared_ptr<Plinth::MetaObj::MetaObject>& result) {
  output->SetResult(result);
  output->Close();
}

void PostSuccess(const OutputPtr& output) { Post(output, Plinth::MetaObj::MetaBool::New(true)); }

void PostText(const OutputPtr& output, const std::string& text) {
  Post(output, Plinth::MetaObj::MetaString::New(text));
}

}  // namespace TessaroCli::IscsiNamespace
