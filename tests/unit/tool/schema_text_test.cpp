// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "store/schema_text.h"

#include <gtest/gtest.h>

#include "store/database.h"

namespace mediidx::tool {
namespace {

TEST(SchemaStatements, LoseTheirCommentLines) {
  EXPECT_EQ(schema_statements("-- a; b\n\nCREATE TABLE x (\n  -- note;\n  y text);\n"),
            "CREATE TABLE x (\n  y text);\n");
}

TEST(SchemaText, IsTheWholeSchema) {
  const std::string text = kSchemaText;
  EXPECT_NE(text.find("CREATE TABLE IF NOT EXISTS public.music"), std::string::npos);
  EXPECT_NE(text.find("(" + std::to_string(kSchemaVersion) + ") ON CONFLICT DO NOTHING"),
            std::string::npos);
}

}  // namespace
}  // namespace mediidx::tool
