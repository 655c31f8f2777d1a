/// The command tree: namespaces and the commands in them.
///
/// A plug-in exports, under its plain name,
///
///     extern "C" void AutoCli_RegisterNamespaces(
///         boost::shared_ptr<Plinth::AutoCli::Namespace> parent);
///
/// The framework calls it once after loading the file, with an empty node; the children that it gets there
/// come under the root. The tree lives on through the shared pointers that parents hold, to the end of the
/// process. Whatever the entry point throws makes the framework drop the plug-in and say so, as does a name
/// that is taken under the root. Texts are UTF-8.
#pragma once

#include <Plinth/CallSpec.h>

#include <boost/enable_shared_from_this.hpp>
#include <boost/shared_ptr.hpp>
#include <memory>
#include <string>

#pragma GCC visibility push(default)

namespace Plinth::AutoCli {

/// The framework's own record of a node.
struct NodeData;

/// A node of the command tree.
class NamespaceNode : public boost::enable_shared_from_this<NamespaceNode> {
 public:
  NamespaceNode(const NamespaceNode&) = delete;
  NamespaceNode& operator=(const NamespaceNode&) = delete;
  virtual ~NamespaceNode();

  /// The line of help that the node shows in the tree; a later call replaces an earlier one.
  void SetDescription(const std::string& text);
  /// Hangs @p child under this node as @p name. Siblings keep the order of the calls.
  /// Throws std::logic_error for a null child, an empty or taken name, or where this node is a command.
  void RegisterNamespaceNode(boost::shared_ptr<NamespaceNode> child, const std::string& name);

 protected:
  NamespaceNode();

 private:
  friend struct NodeData;
  std::unique_ptr<NodeData> data_;
};

/// An inner node.
class Namespace : public virtual NamespaceNode {
 public:
  /// A node without children and description.
  static boost::shared_ptr<Namespace> New();
  ~Namespace() override;

 protected:
  Namespace();
};

/// A leaf. A plug-in derives one class for each command. An object is made once, may run any number of
/// times and keeps nothing between runs; the framework runs one command at a time.
class Command : public virtual NamespaceNode {
 public:
  ~Command() override;

  /// What the command takes; never null.
  virtual boost::shared_ptr<CallSpec::InputSpec> GetInputSpec();
  /// What the command gives; never null.
  virtual boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpec();
  /// Runs the command. Whatever it throws is shown by the framework as a failure of the program.
  virtual void Execute(boost::shared_ptr<CallSpec::Input> input, boost::shared_ptr<CallSpec::Output> output);

 protected:
  Command();

  /// The formatter that shows the result unless the user names another, such as "table". Without the call,
  /// and for a name that is none (a fault in a checked build), it is "simple".
  void SetDefaultOutputFormatter(const std::string& name);
  /// A setting of the formatter; a later call for @p key replaces an earlier one. "fields" or "fields:TYPE"
  /// is the fields to show, separated by commas, in order; "header:TYPE" the heading of each structure of the
  /// type TYPE in "simple", with %NAME% for the value of its field NAME. "dense:TYPE" has no lines there
  /// between structures of the type, for fields without a text and for those in the heading, and breaks lines
  /// to the width of a terminal, but for those of the fields that it names, separated by commas. Other keys
  /// have no effect.
  void SetDefaultOutputParameter(const std::string& key, const std::string& value);
  /// A mark for tools, such as "type" = "fetcher" for a command that reads or "operation" for one that
  /// changes the host. "dry-run" = "heeded" is for a command that asks IsRehearsing() and changes nothing by
  /// library calls. A later call for @p key replaces an earlier one.
  void SetMetaDataField(const std::string& key, const std::string& value);

  // What the operations of the same names do: made anew on each call, and never null. Both objects of a run
  // live to its end.
  virtual boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() = 0;
  virtual boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() = 0;
  virtual void ExecuteInternal(boost::shared_ptr<CallSpec::Input> input,
                               boost::shared_ptr<CallSpec::Output> output) = 0;
};

}  // namespace Plinth::AutoCli

#pragma GCC visibility pop
