/// Tables that tell under which key of a host's record each member of a contract's record stands.
#pragma once

#include <NodeCtl/Records.h>

#include <cstdint>
#include <string>
#include <variant>

#include "host/Schema.h"
#include "host/Storage.h"

namespace corectl {

template <class R>
struct Member {
  const char* path;
  std::variant<std::string R::*, bool R::*, std::uint32_t R::*, std::int32_t R::*,
               NodeCtl::Storage::ExtendedBool R::*>
      place;
};

/// Sets the members of @p filled that stand in the table @p members.
template <class R, std::size_t count>
void Fill(R& filled, const Member<R> (&members)[count], const host::Record& record) {
  for (const Member<R>& member : members) {
    std::visit(
        [&](auto place) {
          using Value = std::remove_reference_t<decltype(filled.*place)>;
          if constexpr (std::is_same_v<Value, std::string>) {
            filled.*place = record.GetString(member.path);
          } else if constexpr (std::is_same_v<Value, bool>) {
            filled.*place = record.GetBool(member.path);
          } else if constexpr (std::is_same_v<Value, NodeCtl::Storage::ExtendedBool>) {
            filled.*place = static_cast<Value>(record.GetWord(member.path, host::kExtendedBools));
          } else {
            filled.*place = static_cast<Value>(record.GetInt64(member.path));
          }
        },
        member.place);
  }
}

}  // namespace corectl
