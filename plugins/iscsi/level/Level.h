/// The three levels at which an adapter keeps session parameters and CHAP entries: its own, a sendtarget's
/// and a target portal's. What differs between them stands here and in Level.cpp, nowhere else.
#pragma once

#include <memory>
#include <vector>

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

using NodeCtl::Storage::iScsiCapabilities;
using NodeCtl::Storage::iScsiChapDirection;
using NodeCtl::Storage::iScsiChapParameters;
using NodeCtl::Storage::iScsiDigestType;
using NodeCtl::Storage::iScsiParms;

enum class Digest { Header, Data };

/// One place that has parameters and CHAP entries. Lives no longer than its adapter object. Every operation
/// is one call of the library, but for the texts of a key.
class Level {
 public:
  Level() = default;
  Level(const Level&) = delete;
  Level& operator=(const Level&) = delete;
  virtual ~Level() = default;

  /// The text by which users know the place.
  virtual std::string Id() = 0;
  /// The parts of it: empty where the level has none.
  virtual std::string TargetName() = 0;
  virtual std::string Address() = 0;

  virtual iScsiParms GetParms() = 0;
  virtual iScsiInterface::iScsiStatus SetParms(const iScsiParms& parms) = 0;
  virtual iScsiDigestType GetDigest(Digest digest) = 0;
  virtual iScsiInterface::iScsiStatus SetDigest(Digest digest, iScsiDigestType value) = 0;
  virtual iScsiChapParameters GetChap(iScsiChapDirection direction) = 0;
  virtual void SetChap(const iScsiChapParameters& chap, iScsiChapDirection direction) = 0;
};

using LevelPtr = std::unique_ptr<Level>;

/// How a level is addressed, and how the commands treat it.
struct LevelKind {
  /// The place that the options name.
  LevelPtr (*find)(iScsiInterface& adapter, const Plinth::CallSpec::Input& input);
  /// The places that the options of a reading command name.
  std::vector<LevelPtr> (*select)(iScsiInterface& adapter, const Plinth::CallSpec::Input& input);

  /// The level has a parent: marks, and the option `inherit`.
  bool inherits;

  // Parameters
  bool iScsiCapabilities::*headerDigestSettable;
  bool iScsiCapabilities::*dataDigestSettable;
  const char* optionsMessage;  ///< not exactly one of the options that say what to set
  bool digestFirst;            ///< a digest is stored ahead of the record, not behind it
  bool statusShown;            ///< the status of a store is acted on

  // CHAP
  bool hasMethod;    ///< the reading command has the option `method`
  bool recordFirst;  ///< the record is read ahead of the test of the direction
  const char* chapGetFailure;
  const char* chapSetFailure;
};

extern const LevelKind kAdapterLevel;
extern const LevelKind kSendTargetLevel;
extern const LevelKind kTargetLevel;

// Parameters by which the commands of a level name its place

constexpr Parameter SendTargetAddress() {
  return String("address", 'a', "The iSCSI sendtarget address: <ip/dns[:port]>").Required();
}
constexpr Parameter TargetName() {
  return String("name", 'n', "The iSCSI target name: <iqn/eui>").Required();
}
constexpr Parameter PortalAddress() {
  return String("address", 'a', "The iSCSI target address: <ip/dns[:port]>").Required();
}

}  // namespace TessaroCli::IscsiNamespace
