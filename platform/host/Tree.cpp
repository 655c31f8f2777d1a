#include "host/Tree.h"

#include <algorithm>

#include "host/Platform.h"

namespace host {

namespace {

/// Of objects that an operation makes, and which the machine has by another id afterwards.
constexpr std::int64_t kFirstMadeId = kFirstMachineId * 2;

}  // namespace

Tree::~Tree() = default;

Machine* Tree::GetMachine() {
  if (!isMachineKnown_) {
    isMachineKnown_ = true;
    machine_ = Platform::Current().MachineOf(*this);
  }
  return machine_.get();
}

bool Tree::IsOfMachine(Kind kind) {
  switch (kind) {
    case Kind::Nic:
    case Kind::BootTable:
    case Kind::Session:
    case Kind::Connection:
      return GetMachine() != nullptr;
    default:
      return false;
  }
}

std::vector<Object> Tree::OfMachine(std::int64_t parent, Kind kind) {
  if (GetMachine() == nullptr) return {};
  std::vector<Object> all = machine_->Children(parent, kind);
  std::erase_if(all, [&](const Object& object) { return gone_.contains(object.id); });
  for (const Object& object : made_) {
    if (object.parent == parent && object.kind == kind) all.push_back(object);
  }
  return all;
}

std::optional<Object> Tree::Lookup(std::int64_t id) {
  if (id < kFirstMachineId) return store::Tree::Lookup(id);
  for (const Object& object : made_) {
    if (object.id == id) return object;
  }
  if (GetMachine() == nullptr || gone_.contains(id)) return {};
  return machine_->Lookup(id);
}

const Object* Tree::Look(std::int64_t id) {
  if (id < kFirstMachineId) return store::Tree::Look(id);
  looked_ = Lookup(id);
  return looked_ ? &*looked_ : nullptr;
}

std::optional<Object> Tree::Find(std::int64_t parent, Kind kind, std::string_view name) {
  if (!IsOfMachine(kind)) {
    std::optional<Object> found = store::Tree::Find(parent, kind, name);
    if (found || kind != Kind::Target) return found;
  }
  for (Object& object : OfMachine(parent, kind)) {
    if (object.name == name) return std::move(object);
  }
  return {};
}

std::vector<Object> Tree::Children(std::int64_t parent, Kind kind) {
  if (IsOfMachine(kind)) return OfMachine(parent, kind);
  std::vector<Object> children = store::Tree::Children(parent, kind);
  if (kind == Kind::Target) {
    for (Object& object : OfMachine(parent, kind)) children.push_back(std::move(object));
  }
  return children;
}

std::vector<std::int64_t> Tree::ChildIds(std::int64_t parent, Kind kind) {
  std::vector<std::int64_t> ids;
  if (!IsOfMachine(kind)) ids = store::Tree::ChildIds(parent, kind);
  if (!IsOfMachine(kind) && kind != Kind::Target) return ids;
  for (const Object& object : OfMachine(parent, kind)) ids.push_back(object.id);
  return ids;
}

void Tree::ForEachChild(std::int64_t parent, Kind kind,
                        const std::function<void(std::int64_t id, const Record& record)>& visit) {
  if (!IsOfMachine(kind)) store::Tree::ForEachChild(parent, kind, visit);
  if (!IsOfMachine(kind) && kind != Kind::Target) return;
  for (const Object& object : OfMachine(parent, kind)) visit(object.id, object.record);
}

Object Tree::Insert(std::int64_t parent, Kind kind, Record record) {
  if (!IsOfMachine(kind)) return store::Tree::Insert(parent, kind, std::move(record));
  std::string name = NameOf(kind, record);
  made_.push_back({.id = kFirstMadeId + static_cast<std::int64_t>(made_.size()),
                   .parent = parent,
                   .kind = kind,
                   .name = std::move(name),
                   .record = std::move(record)});
  return made_.back();
}

std::int64_t Tree::Add(std::int64_t parent, Kind kind, std::string_view name, const Record& record) {
  return IsOfMachine(kind) ? Insert(parent, kind, record).id : store::Tree::Add(parent, kind, name, record);
}

void Tree::Update(const Object& object) {
  if (object.id < kFirstMachineId) store::Tree::Update(object);
}

void Tree::Remove(std::int64_t id) {
  if (id < kFirstMachineId) return store::Tree::Remove(id);
  gone_.insert(id);
  std::erase_if(made_, [&](const Object& object) { return object.id == id; });
}

Network& Tree::GetNetwork() {
  if (exchanges_ == nullptr) {
    exchanges_ = std::make_unique<Exchanges>(Platform::Current().NetworkOf(*this));
  }
  return *exchanges_;
}

void Tree::BeginOperation() {
  BeginAnew();
  answer_.reset();
  exchanges_.reset();
  machine_.reset();
  isMachineKnown_ = false;
}

void Tree::BeginAnew() {
  made_.clear();
  gone_.clear();
}

}  // namespace host
