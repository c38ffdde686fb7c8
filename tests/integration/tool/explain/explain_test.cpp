// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "explain_test.h"

#include <json/reader.h>
#include <tavocore.h>

#include <sstream>
#include <stdexcept>

#include "mediidx/index_folder.h"
#include "mediidx/root.h"

namespace mediidx::test {

ExplainTest::ExplainTest() {
  data.write("d/.mediidx", "");
  home.write("ada/.profile", "");
  data.write("d/root/etc/passwd", "ada:x:1026:1026::" + home.at("ada") + ":/bin/sh\n");
  TAVOMediaIndexRootSet(data.at("d/root").c_str());
  TAVOPlatformRootSet(data.at("d/root").c_str());
  set_shares(R"("media": {"path": ")" + media.path().string() + R"(", "status": 32})");
  choose(R"({"name": "All of it", "path": "/media", "photo": true, "music": true, "video": true,
             "default": false})");
}

void ExplainTest::load() const { IndexFolderUpdate(); }

void ExplainTest::choose(const std::string& entries) const {
  data.write("d/root/usr/tavo/etc/index_folder.conf", "[" + entries + "]");
  load();
}

void ExplainTest::set_shares(const std::string& members) const {
  data.write("d/root/usr/tavo/etc/share.conf", "{" + members + "}");
  load();
}

Json::Value ExplainTest::json_with(int status, Words words) const {
  words.insert(words.begin(), "--json");
  const auto done = run(words);
  EXPECT_EQ(done.status, status) << done.err;
  std::istringstream in(done.out);
  Json::Value value;
  std::string errors;
  if (!Json::parseFromStream(Json::CharReaderBuilder(), in, &value, &errors)) {
    throw std::runtime_error(errors);
  }
  return value;
}

void ExplainTest::index() const {
  const auto done = run({"index", media.path()});
  ASSERT_EQ(done.status, 0) << done.err;
}

}  // namespace mediidx::test
