#include "host/Pending.h"

#include <nlohmann/json.hpp>

#include "host/Storage.h"
#include "store/Document.h"

namespace host {

namespace {

constexpr const char* kPending = "pending";
/// What never waits: an entry and the mark whether it is the one that holds are set by operations of their
/// own.
constexpr const char* kChap = "chap";

/// The parts of @p after that differ from @p before, as a merge patch (RFC 7396): a key that is gone is null.
Json Difference(const Json& before, const Json& after) {
  Json difference = Json::object();
  for (const auto& [key, value] : after.items()) {
    const auto old = before.find(key);
    if (old == before.end() || old->type() != value.type() || !value.is_object()) {
      if (old == before.end() || *old != value) difference[key] = value;
    } else {
      Json below = Difference(*old, value);
      if (!below.empty()) difference[key] = std::move(below);
    }
  }
  for (const auto& item : before.items()) {
    if (!after.contains(item.key())) difference[item.key()] = nullptr;
  }
  return difference;
}

/// Takes out of @p patch what @p changes says anew.
void Supersede(Json& patch, const Json& changes) {
  for (const auto& [key, value] : changes.items()) {
    const auto old = patch.find(key);
    if (old == patch.end()) continue;
    if (old->is_object() && value.is_object()) {
      Supersede(*old, value);
      if (!old->empty()) continue;
    }
    patch.erase(key);
  }
}

/// The patch that makes of @p record what @p patch and then @p more make of it.
Json Combined(const Json& record, const Json& patch, const Json& more = Json::object()) {
  Json patched = record;
  patched.merge_patch(patch);
  patched.merge_patch(more);
  return Difference(record, patched);
}

std::string_view WordOf(Effect effect) { return kEffects[static_cast<std::size_t>(effect)]; }

/// The patch that waits for @p effect; empty where nothing does.
Json PatchOf(const Json& record, Effect effect) {
  const auto pending = record.find(kPending);
  if (pending == record.end()) return Json::object();
  const auto patch = pending->find(std::string(WordOf(effect)));
  return patch == pending->end() ? Json::object() : *patch;
}

Json WithoutPending(const Json& record) {
  Json json = record;
  json.erase(kPending);
  return json;
}

/// The record of @p json, its keys in the order of the schema and with the defaults of what a patch left out.
Record Completed(Kind kind, const Json& json) { return Complete(kind, Record(json)); }

Effect AskedFor(const std::optional<Status>& answer, Effect effect) {
  if (!answer) return effect;
  if (*answer == Status::RebootRequired) return Effect::Reboot;
  return *answer == Status::ResetRequired ? Effect::Reset : Effect::Now;
}

void TakeEffectOf(Tree& tree, const Object& object, Effect until) {
  if (!object.record.Has(kPending)) return;
  Json record = WithoutPending(object.record.GetJson());
  Json reboot = PatchOf(object.record.GetJson(), Effect::Reboot);
  record.merge_patch(PatchOf(object.record.GetJson(), Effect::Reset));
  if (until == Effect::Reboot) {
    record.merge_patch(reboot);
  } else {
    reboot = Combined(record, reboot);
    if (!reboot.empty()) record[kPending][std::string(WordOf(Effect::Reboot))] = std::move(reboot);
  }
  Object changed = object;
  changed.record = Completed(object.kind, record);
  tree.Update(changed);
}

std::string ValueText(const Json& value) {
  return value.is_null() ? "" : value.is_string() ? value.get<std::string>() : value.dump();
}

/// Adds a change for each value that @p patch sets in @p record. @p change tells the rest.
void AddChanges(const Json& record, const Json& patch, const WaitingChange& change,
                std::vector<WaitingChange>& changes) {
  for (const auto& [key, value] : patch.items()) {
    WaitingChange one = change;
    one.setting += (one.setting.empty() ? "" : "/") + key;
    const Json before = record.is_object() ? record.value(key, Json()) : Json();
    if (!value.is_object()) {
      one.from = ValueText(before);
      one.to = ValueText(value);
      changes.push_back(std::move(one));
    } else if (before.is_null() && value.contains("current")) {
      // A parameter of the adapter that was at its standard: what it can be comes with its value.
      one.from = ValueText(value.value("default", Json()));
      one.to = ValueText(value["current"]);
      changes.push_back(std::move(one));
    } else {
      AddChanges(before, value, one, changes);
    }
  }
}

void AddChanges(const Object& object, WaitingChange change, std::vector<WaitingChange>& changes) {
  if (!object.record.Has(kPending)) return;
  const Json record = object.record.GetJson();
  for (const Effect effect : {Effect::Reset, Effect::Reboot}) {
    change.effect = effect;
    AddChanges(record, PatchOf(record, effect), change, changes);
  }
}

}  // namespace

Effect EffectOf(const Record& adapter, Setting setting) {
  const SettingSpec& spec = kSettings[static_cast<std::size_t>(setting)];
  const std::string path = "applies/" + std::string(spec.name);
  if (adapter.Has(path)) return static_cast<Effect>(adapter.GetWord(path, kEffects));
  return adapter.GetString("kind") == "independent" ? spec.ofIndependent : Effect::Now;
}

Object Configured(const Object& object) {
  Object configured = object;
  if (!object.record.Has(kPending)) return configured;
  const Json& json = object.record.GetJson();
  Json record = WithoutPending(json);
  record.merge_patch(PatchOf(json, Effect::Reset));
  record.merge_patch(PatchOf(json, Effect::Reboot));
  configured.record = Completed(object.kind, record);
  return configured;
}

bool DoesWait(const Object& object, const std::string& path) {
  const auto waitsFor = [&](Effect effect) {
    return object.record.Has(std::string(kPending) + '/' + std::string(WordOf(effect)) + '/' + path);
  };
  return waitsFor(Effect::Reset) || waitsFor(Effect::Reboot);
}

Status StoreConfigured(Tree& tree, const Object& object, const Record& configured, Effect effect) {
  effect = AskedFor(tree.Answer(), effect);
  const Json& json = object.record.GetJson();
  const Json changes = Difference(Configured(object).record.GetJson(), configured.GetJson());
  Json record = WithoutPending(json);
  if (effect == Effect::Now) {
    record.merge_patch(changes);
  } else if (changes.contains(kChap)) {
    record.merge_patch({{kChap, changes[kChap]}});
  }
  Json pending = Json::object();
  Status status = Status::Success;
  for (const Effect waiting : {Effect::Reset, Effect::Reboot}) {
    Json patch = PatchOf(json, waiting);
    Supersede(patch, changes);
    patch = waiting == effect ? Combined(record, patch, changes) : Combined(record, patch);
    if (patch.empty()) continue;
    pending[std::string(WordOf(waiting))] = std::move(patch);
    if (waiting == effect) {
      status = effect == Effect::Reboot ? Status::RebootRequired : Status::ResetRequired;
    }
  }
  if (!pending.empty()) record[kPending] = std::move(pending);
  Object changed = object;
  // Where something waits, a change may concern a part of what is not in effect yet.
  changed.record = json.contains(kPending) ? Completed(object.kind, record) : Record(record);
  tree.Update(changed);
  return status;
}

void TakeEffect(Tree& tree, const Object& adapter, Effect until) {
  TakeEffectOf(tree, adapter, until);
  for (const Kind kind : {Kind::SendTarget, Kind::StaticTarget}) {
    for (const Object& place : tree.Children(adapter.id, kind)) TakeEffectOf(tree, place, until);
  }
}

std::vector<WaitingChange> WaitingChanges(Tree& tree) {
  std::vector<WaitingChange> changes;
  if (tree.Get(kRoot, Kind::Host).record.GetBool("softwareIscsi/rebootPending")) {
    changes.push_back({{}, {}, "softwareIscsi/enabled", "true", "false", Effect::Reboot});
  }
  for (const Object& adapter : tree.Children(kRoot, Kind::Adapter)) {
    AddChanges(adapter, {adapter.name, {}, {}, {}, {}, {}}, changes);
    for (const Kind kind : {Kind::SendTarget, Kind::StaticTarget}) {
      for (const Object& place : tree.Children(adapter.id, kind)) {
        AddChanges(place, {adapter.name, place.name, {}, {}, {}, {}}, changes);
      }
    }
  }
  return changes;
}

}  // namespace host
