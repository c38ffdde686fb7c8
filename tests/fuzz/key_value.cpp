// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <tavocore.h>

#include <array>
#include <map>
#include <memory>

#include "fuzz.h"

namespace {

using namespace mediidx;
using Hash = std::unique_ptr<TLIBSZHASH, decltype(&TLIBCSzHashFree)>;

bool is_space(char c) { return std::string_view(" \t\v\f\r").find(c) != std::string_view::npos; }

std::string trimmed(std::string text) {
  while (!text.empty() && is_space(text.back())) text.pop_back();
  while (!text.empty() && is_space(text.front())) text.erase(0, 1);
  return text;
}

/// The entries of a file, the first of each key, found the slow way.
std::map<std::string, std::string> entries(std::string_view file, const std::string& separator) {
  std::map<std::string, std::string> found;
  if (file.starts_with("\xEF\xBB\xBF")) file.remove_prefix(3);
  fuzz::for_each_line(file, [&](std::string_view line) {
    const auto at = line.find(separator);
    const auto key = trimmed(std::string(line.substr(0, at)));
    const bool is_entry = at != line.npos && !key.empty() && key.find('\0') == key.npos;
    if (!is_entry || trimmed(std::string(line)).starts_with('#')) return;
    auto value = trimmed(std::string(line.substr(at + separator.size())));
    if (value.size() > 1 && value.front() == '"' && value.back() == '"') {
      value = value.substr(1, value.size() - 2);
    }
    found.emplace(key, value.c_str());
  });
  return found;
}

}  // namespace

/// A key to look for, a separator, and the file.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static const fuzz::MemoryFile file;
  fuzz::Input input(data, size);
  const auto wanted = input.text();
  const auto separator = input.text();
  const auto text = input.rest();
  file.write(text);

  const Hash all(TLIBCSzHashAlloc(16), TLIBCSzHashFree);
  const int count = TLIBCFileGetKeys(file.path().c_str(), nullptr, all.get(), separator.c_str());
  fuzz::check((count == -1) == separator.empty());
  if (separator.empty()) return 0;
  const auto expected = entries(text, separator);
  fuzz::check(count == static_cast<int>(expected.size()) && TLIBCSzHashCount(all.get()) == count);
  for (const auto& [key, value] : expected) {
    const char* found = TLIBCSzHashGetValue(all.get(), key.c_str());
    fuzz::check(found && found == value);
  }

  const Hash one(TLIBCSzHashAlloc(1), TLIBCSzHashFree);
  const int has_one =
      TLIBCFileGetKeys(file.path().c_str(), wanted.c_str(), one.get(), separator.c_str());
  const auto known = expected.find(wanted);
  fuzz::check(has_one == (known == expected.end() ? 0 : 1));
  std::array<char, 8> value;
  value.fill('#');
  const int result = TLIBCFileGetKeyValue(file.path().c_str(), wanted.c_str(), value.data(),
                                          static_cast<int>(value.size()), 0);
  if (separator == "=") fuzz::check(result == has_one);
  fuzz::check(result == 0 ? value[0] == '#'
                          : fuzz::is_terminated(reinterpret_cast<char(&)[8]>(value)));
  if (result == 1 && separator == "=") fuzz::check(known->second.starts_with(value.data()));
  return 0;
}
