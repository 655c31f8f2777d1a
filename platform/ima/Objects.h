/// Calls on one object, which most calls are.
#pragma once

#include <ima/ima.h>

#include "host/Targets.h"
#include "ima/Operation.h"
#include "ima/Values.h"

namespace ima {

/// The type of a route's OID, which the published types lack.
inline constexpr IMA_OBJECT_TYPE kRouteType = 0x1000;

/// The object @p oid of the type @p type. Errors: WrongObject for one of another type, NotFound for one that
/// is gone.
host::Object Get(host::Tree& tree, const IMA_OID& oid, IMA_OBJECT_TYPE type);

/// The same without a copy, as Tree::See.
const host::Object& See(host::Tree& tree, const IMA_OID& oid, IMA_OBJECT_TYPE type);

/// The same for a target.
host::KnownTarget GetTarget(host::Tree& tree, const IMA_OID& oid);

template <class Body>
IMA_STATUS ReadObject(host::Operation operation, const IMA_OID& oid, Body&& body) noexcept {
  return StatusOf(
      [&] { host::Host::Current().Read(host::Call::Ima(operation, Id(oid), {OidArgument(oid)}), body); });
}

/// Fills @p properties with what @p fill makes of the object's record; unchanged when that fails.
template <class Properties, class Fill>
IMA_STATUS ReadProperties(host::Operation operation, const IMA_OID& oid, IMA_OBJECT_TYPE type,
                          Properties* properties, Fill&& fill) noexcept {
  return ReadObject(operation, oid, [&](host::Tree& tree) {
    Properties filled{};
    fill(tree, See(tree, oid, type), filled);
    *properties = filled;
  });
}

/// The ids of the objects of @p kind below the object @p oid.
IMA_STATUS ListChildren(host::Operation operation, const IMA_OID& oid, IMA_OBJECT_TYPE type, host::Kind kind,
                        IMA_OBJECT_TYPE childType, IMA_OID_LIST** list) noexcept;

}  // namespace ima
