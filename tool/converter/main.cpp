// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The converter that the library starts for cue sheets in legacy character sets, where the
// stand-alone root has it instead of a script interpreter:
//   [options] SCRIPT --from CHARSET --to CHARSET FILE
// Everything before "--from" belongs to the interpreter and is not looked at. The converted text
// goes to standard output. Exit status: 0 done, 1 failed, 2 usage.
#include <cstdio>
#include <exception>
#include <memory>
#include <string>
#include <string_view>

#include "converter/text_converter.h"

namespace {

struct Arguments {
  std::string from;
  std::string to;
  const char* file = nullptr;
};

Arguments parse(int argc, char** argv) {
  Arguments arguments;
  for (int i = 1; i + 1 < argc; ++i) {
    const std::string_view name = argv[i];
    if (name == "--from") arguments.from = argv[++i];
    if (name == "--to") arguments.to = argv[++i];
  }
  if (argc > 1) arguments.file = argv[argc - 1];
  return arguments;
}

bool put(const std::string& text) {
  return std::fwrite(text.data(), 1, text.size(), stdout) == text.size();
}

bool convert(const Arguments& arguments) {
  const std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(std::fopen(arguments.file, "re"),
                                                             std::fclose);
  if (!file) {
    std::perror(arguments.file);
    return false;
  }
  mediidx::tool::TextConverter converter(arguments.from, arguments.to);
  char buffer[65536];
  for (std::size_t length; (length = std::fread(buffer, 1, sizeof(buffer), file.get())) > 0;) {
    if (!put(converter.convert({buffer, length}))) return false;
  }
  return put(converter.finish()) && std::fflush(stdout) == 0 && !std::ferror(file.get());
}

}  // namespace

int main(int argc, char** argv) {
  const auto arguments = parse(argc, argv);
  if (arguments.from.empty() || arguments.to.empty() || !arguments.file) {
    std::fprintf(stderr, "usage: %s [options] script --from CHARSET --to CHARSET FILE\n", argv[0]);
    return 2;
  }
  try {
    return convert(arguments) ? 0 : 1;
  } catch (const std::exception& error) {
    std::fprintf(stderr, "%s: %s\n", arguments.file, error.what());
    return 1;
  }
}
