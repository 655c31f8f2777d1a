/// The commands that stand on no path of the tree. Whoever has a use for one makes it from here:
///
///     RouteAdd::New()->Execute(input, output);
///
/// Each is defined in the file of its name, like the commands of the tree.
#pragma once

#include "CommandFrame.h"

// The plug-in hides its symbols, but for its entry point and these classes.
#pragma GCC visibility push(default)

namespace TessaroCli::IscsiNamespace {

class AdapterDiscoveryIsnsAdd : public CommandFrame<AdapterDiscoveryIsnsAdd> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<AdapterDiscoveryIsnsAdd> New();

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

class AdapterDiscoveryIsnsList : public CommandFrame<AdapterDiscoveryIsnsList> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<AdapterDiscoveryIsnsList> New();
  StructPtr GetListType() const;

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

class AdapterDiscoveryIsnsParamGet : public CommandFrame<AdapterDiscoveryIsnsParamGet> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<AdapterDiscoveryIsnsParamGet> New();
  StructPtr GetOutputStructure() const;

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

class AdapterDiscoveryIsnsParamSet : public CommandFrame<AdapterDiscoveryIsnsParamSet> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<AdapterDiscoveryIsnsParamSet> New();

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

class AdapterDiscoveryIsnsRemove : public CommandFrame<AdapterDiscoveryIsnsRemove> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<AdapterDiscoveryIsnsRemove> New();

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

class AdapterIsnsParamGet : public CommandFrame<AdapterIsnsParamGet> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<AdapterIsnsParamGet> New();
  StructPtr GetOutputStructure() const;

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

class AdapterIsnsParamSet : public CommandFrame<AdapterIsnsParamSet> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<AdapterIsnsParamSet> New();

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

class RouteAdd : public CommandFrame<RouteAdd> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<RouteAdd> New();

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

class RouteList : public CommandFrame<RouteList> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<RouteList> New();
  StructPtr GetListType() const;

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

class RouteRemove : public CommandFrame<RouteRemove> {
 public:
  static const Declaration kDeclaration;
  static boost::shared_ptr<RouteRemove> New();

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override;
};

}  // namespace TessaroCli::IscsiNamespace

#pragma GCC visibility pop
