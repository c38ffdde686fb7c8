// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// What would be stored of a file, beside what stands in it.
#include <array>
#include <cstdio>

#include "cli/file_operand.h"
#include "cli/output.h"
#include "cli/row_output.h"
#include "cli/verbs.h"
#include "explain/raw_tags.h"
#include "explain/stored_record.h"
#include "mediidx/request.h"
#include "store/data_folder.h"
#include "text/utf8.h"

namespace mediidx::tool {
namespace {

MediaFile read(const std::string& path, Kind kind) {
  try {
    return read_media_file(path, kind);
  } catch (const ReadError& error) {
    throw std::runtime_error(escape_for_display(path) + " would not be indexed: " + error.what());
  }
}

Json::Value as_json(const Json::Value& value) {
  return value.isString() ? json_text(value.asString()) : value;
}

void print_json(const MediaFile& file, const std::vector<StoredField>& fields,
                const std::vector<RawTag>& tags) {
  Json::Value out;
  out["path"] = json_text(file.path);
  out["userid"] = TAVOMediaIndexGetUserIdFromPath(file.path.c_str());
  auto& record = out["record"] = Json::Value(Json::arrayValue);
  for (const auto& field : fields) {
    Json::Value object;
    object["field"] = field.name;
    object["read"] = as_json(field.read);
    object["stored"] = as_json(field.stored);
    object["note"] = field.note;
    record.append(object);
  }
  auto& list = out["tags"] = Json::Value(Json::arrayValue);
  for (const auto& tag : tags) {
    const auto cleaned = clean_text(tag.value);
    Json::Value object;
    object["tag"] = json_text(tag.name);
    object["value"] = is_utf8(tag.value) ? tag.value : escape_for_display(tag.value);
    object["cleaned"] = cleaned != tag.value ? Json::Value(cleaned) : Json::Value();
    list.append(object);
  }
  put_json(out);
}

/// A number without the digits that its binary form adds.
std::string shown(const Json::Value& value) {
  if (value.type() != Json::realValue) return value.asString();
  std::array<char, 32> text;
  std::snprintf(text.data(), text.size(), "%.10g", value.asDouble());
  return text.data();
}

void print(const std::vector<StoredField>& fields, const std::vector<RawTag>& tags) {
  std::vector<TableRow> lines;
  for (const auto& field : fields) {
    lines.push_back({field.name, shown(field.read), shown(field.stored), field.note});
  }
  for (const auto& tag : tags) {
    const auto cleaned = clean_text(tag.value);
    const bool is_clean = cleaned == tag.value;
    lines.push_back(
        {"tag " + tag.name, tag.value, is_clean ? "" : cleaned, is_clean ? "" : "cleaned"});
  }
  put_table({{"Field"}, {"Read"}, {"Stored"}, {"Note"}}, lines);
}

}  // namespace

int run_inspect(const Arguments& arguments) {
  const auto path = readable_file(arguments.operands[0]);
  const auto kind = kind_of(path);
  if (!kind) throw no_such_kind(path, "medium");
  // Settings for reading tags, and the users, stand there.
  const DataFolder data(arguments.value("--data-dir"));
  const auto file = read(path, *kind);
  const auto fields = stored_fields(file);
  const auto tags = raw_tags(path, *kind);
  if (arguments.has("--json")) {
    print_json(file, fields, tags);
  } else {
    print(fields, tags);
  }
  return kExitDone;
}

}  // namespace mediidx::tool
