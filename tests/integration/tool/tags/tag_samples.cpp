// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "tag_samples.h"

#include <json/value.h>

#include <cmath>
#include <cstdio>

namespace mediidx::test {
namespace {

std::string text_of(const Json::Value& value) {
  if (value.type() != Json::realValue) return value.asString();
  char text[32];
  std::snprintf(text, sizeof(text), "%g", value.asDouble());
  return text;
}

}  // namespace

std::string tag_sample(const std::string& name) {
  return std::string(MEDIIDX_TAG_SAMPLES) + "/" + name;
}

tool::MediaFile read_sample(const std::string& name) {
  const auto path = tag_sample(name);
  const auto kind = tool::kind_of(path);
  if (!kind) throw tool::ReadError(name + " is of no kind");
  return tool::read_media_file(path, *kind);
}

Fields fields_of(const std::string& name) {
  auto file = read_sample(name);
  file.duration = std::round(file.duration);
  const auto json = to_json(file);
  Fields out;
  for (const auto& field : json.getMemberNames()) {
    const bool of_file_system = field == "szPath" || field == "date" || field == "mdate" ||
                                field == "filesize" || field == "fs_uuid";
    const auto text = text_of(json[field]);
    if (of_file_system || text.empty() || text == "0") continue;
    out[field] = field.ends_with("bitrate") ? "some" : text;
  }
  return out;
}

Fields with(Fields fields, const Fields& others) {
  for (const auto& [name, text] : others) {
    if (text.empty()) {
      fields.erase(name);
    } else {
      fields[name] = text;
    }
  }
  return fields;
}

}  // namespace mediidx::test
