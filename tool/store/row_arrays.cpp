// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "store/row_arrays.h"

#include "store/query.h"

namespace mediidx::tool {

RowArrays::RowArrays(std::initializer_list<const char*> types) {
  for (const char* type : types) columns_.push_back({type, {}});
}

void RowArrays::append(std::string& elements, std::string_view text) {
  elements += '"';
  for (const char c : text) {
    if (c == '"' || c == '\\') elements += '\\';
    elements += c;
  }
  elements += "\",";
}

std::string RowArrays::unnest() const {
  std::string out = "unnest(";
  for (const auto& [type, elements] : columns_) {
    const auto all =
        std::string_view(elements).substr(0, elements.empty() ? 0 : elements.size() - 1);
    out += literal("{" + std::string(all) + "}") + "::" + type + "[], ";
  }
  out.replace(out.size() - 2, 2, ")");
  return out;
}

}  // namespace mediidx::tool
