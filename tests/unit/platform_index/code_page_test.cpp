// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>
#include <tavoindex.h>

#include "unit/platform_core/temporary_folder.h"

namespace {

using mediidx::test::TemporaryRoot;

TEST(TheCodePage, IsTheSettingOfThatName) {
  const TemporaryRoot root;
  root.write("etc/tavoinfo.conf", "language=\"enu\"\ncodepage=\"jpn\"\n");
  EXPECT_STREQ(TAVOIndexCodePageGet(), "jpn");
}

TEST(TheCodePage, MayBeTheNameOfACharset) {
  const TemporaryRoot root;
  root.write("etc/tavoinfo.conf", "codepage=ISO-8859-15\n");
  EXPECT_STREQ(TAVOIndexCodePageGet(), "ISO-8859-15");
}

TEST(TheCodePage, IsEmptyWhenNoneIsSet) {
  const TemporaryRoot root;
  EXPECT_STREQ(TAVOIndexCodePageGet(), "");
  root.write("etc/tavoinfo.conf", "language=enu\n");
  EXPECT_STREQ(TAVOIndexCodePageGet(), "");
}

TEST(TheCodePage, IsReadEachTime) {
  const TemporaryRoot root;
  root.write("etc/tavoinfo.conf", "codepage=jpn\n");
  EXPECT_STREQ(TAVOIndexCodePageGet(), "jpn");
  root.write("etc/tavoinfo.conf", "codepage=rus\n");
  EXPECT_STREQ(TAVOIndexCodePageGet(), "rus");
  root.write("etc/tavoinfo.conf", "");
  EXPECT_STREQ(TAVOIndexCodePageGet(), "");
}

}  // namespace
