#include "host/Levels.h"

#include "host/LevelSchema.h"

namespace host {

std::int64_t ValueAt(const Record& record, const std::string& path, Type type) {
  return type == Type::Boolean ? std::int64_t{record.GetBool(path)} : record.GetInt64(path);
}

std::string PathOf(std::string_view group, std::string_view key) {
  return std::string(group) + '/' + std::string(key);
}

std::int64_t ParameterAt(const Inheritance& levels, std::size_t index, std::size_t* depth) {
  const ParameterSpec& spec = kParameters[index];
  const std::string path = PathOf("parameters", spec.name);
  std::size_t from = 0;
  while (from + 1 < levels.size() && !levels[from]->Has(path)) ++from;
  if (depth != nullptr) *depth = from;
  const bool isAdapter = from + 1 == levels.size();
  if (isAdapter && !levels[from]->Has(path)) return spec.value;
  return ValueAt(*levels[from], isAdapter ? path + "/current" : path, spec.type);
}

Demand DigestAt(const Inheritance& levels, std::size_t index) {
  const std::string path = PathOf("parameters", kDigests[index]);
  for (const Record* level : levels) {
    if (level->Has(path)) return static_cast<Demand>(level->GetWord(path, kDemands));
  }
  return Demand::Prohibited;
}

ChapEntry ChapAt(const Inheritance& levels, std::size_t index) {
  const std::string path = PathOf("chap", kDirections[index]);
  for (const Record* level : levels) {
    const bool isAdapter = level == levels.back();
    if (!level->Has(path) || (!isAdapter && level->GetBool(path + "/inherited"))) continue;
    return {.demand = static_cast<Demand>(level->GetWord(path + "/level", kDemands)),
            .name = level->GetString(path + "/name"),
            .secret = level->GetString(path + "/secret")};
  }
  return {.demand = Demand::Prohibited, .name = "none", .secret = "none"};
}

}  // namespace host
