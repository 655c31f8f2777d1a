/// The walk over the host's adapters, all or the one that the user named, that listing commands share.
///
///     ListAdapters(input, output, Reporting("Unable to list."), GetListType(), NothingPassedOver,
///                  [](const ListedAdapter& listed, MetaList& list) { list.Append(...); });
#pragma once

#include <string>

#include "CommandFrame.h"
#include "OwnedVector.h"

namespace TessaroCli::IscsiNamespace {

/// An adapter of the walk. All of it lives as long as the walk is at it.
struct ListedAdapter {
  CoreCtl::Storage::StorageInfoImpl& storage;
  iScsiInterface& adapter;
  const std::string& name;  ///< of the adapter
};

/// Tells whether the walk goes on to the next adapter when listing @p adapter failed. The rows that the
/// adapter had by then stay. Any other failure ends the walk, and no row is shown.
using PassedOver = bool (*)(iScsiInterface& adapter, const NodeCtl::Lib::NodeCtlException& failure);

inline bool NothingPassedOver(iScsiInterface&, const NodeCtl::Lib::NodeCtlException&) { return false; }
inline bool EverythingPassedOver(iScsiInterface&, const NodeCtl::Lib::NodeCtlException&) { return true; }

/// Posts the list of structures such as @p element that @p body fills, called for each adapter in turn, or
/// for the one of the option "adapter" where that is not empty.
template <class Body>
void ListAdapters(const InputPtr& input, const OutputPtr& output, const FailureReport& report,
                  const StructPtr& element, PassedOver passedOver, Body&& body) {
  const std::string wanted = input->GetString("adapter");
  CoreCtl::Storage::StorageInfoImpl storage;
  const ListPtr list = NewList(element);
  Guarded(output, report, [&] {
    const OwnedVector<iScsiInterface> adapters(storage.GetiScsiInterfaces());
    bool found = wanted.empty();
    for (iScsiInterface* adapter : adapters) {
      if (adapter == nullptr) continue;
      const std::string name = adapter->GetName();
      if (!wanted.empty() && name != wanted) continue;
      found = true;
      try {
        body(ListedAdapter{storage, *adapter, name}, *list);
        if (!wanted.empty()) break;
      } catch (const NodeCtl::Lib::NodeCtlException& failure) {
        if (!passedOver(*adapter, failure)) throw;
      }
    }
    if (!found) return output->ReportError(InvalidAdapterMessage);
    Post(output, list);
  });
}

}  // namespace TessaroCli::IscsiNamespace
