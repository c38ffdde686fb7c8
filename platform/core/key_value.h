// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// Lines of key and value, as configuration and rating files hold them.
#ifndef TAVOCORE_KEY_VALUE_H_
#define TAVOCORE_KEY_VALUE_H_

#include <optional>
#include <string_view>

namespace mediidx::platform {

struct KeyValue {
  std::string_view key;
  std::string_view value;
};

/// Reads the entries of a text one after another; the views live as long as the text.
class KeyValueReader {
 public:
  KeyValueReader(std::string_view text, std::string_view separator);

  /// The next entry, comments and lines that hold none passed over; empty at the end.
  std::optional<KeyValue> next();

 private:
  std::string_view rest_;
  std::string_view separator_;
};

}  // namespace mediidx::platform

#endif
