// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Looking many rows up at once: by a list of candidates, by a hash.
#include <tavocore.h>

#include "media_test.h"
#include "support/owned.h"

namespace mediidx::test {
namespace {

using testing::StartsWith;
using testing::UnorderedElementsAre;

std::string pointer(const void* address) {
  char text[32];
  std::snprintf(text, sizeof(text), "%p", address);
  return text;
}

class Batch : public MediaTest {
 protected:
  Batch() {
    rows("INSERT INTO photo(path, title) VALUES('/Ünder/a', 'one'), ('/b', 'two'), ('/c', NULL)");
  }
  void add(const std::string& candidate) {
    ASSERT_EQ(MediaInfoDBBatchPara(candidates.get(), candidate.c_str()), 0);
  }
  Handle open_batch(const char* columns = nullptr, const char* field = "path",
                    const char* group_by = nullptr, const char* order_by = nullptr,
                    uint32_t range_a = 0, uint32_t range_b = 0) {
    return {MediaInfoDBBatchOpen(MEDIA_TABLE_PHOTO, columns, field, candidates.get(), group_by,
                                 order_by, range_a, range_b),
            MediaInfoDBBatchClose};
  }

  const OwnedList candidates{TLIBCSzListAlloc(512)};
  const OwnedHash hash{TLIBCSzHashAlloc(64)};
};

class AddingACandidate : public Batch {};

TEST_F(AddingACandidate, RefusesAMissingListOrText) {
  EXPECT_EQ(MediaInfoDBBatchPara(nullptr, "/a"), -1);
  EXPECT_EQ(MediaInfoDBBatchPara(candidates.get(), nullptr), -1);
  EXPECT_THAT(
      log_lines(),
      ElementsAre(parens("pCandidateList=" + pointer(nullptr) + ", szCandidate=/a"),
                  parens("pCandidateList=" + pointer(candidates.get()) + ", szCandidate=(null)")));
}

TEST_F(AddingACandidate, FailsWhenTheListDoes) {
  const Failing push("TLIBCSzListPush");
  EXPECT_EQ(MediaInfoDBBatchPara(candidates.get(), "/a"), -1);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to TLIBCSzListPush(" +
                                              pointer(candidates.get()) + ", /a).")));
}

class OpeningABatch : public Batch {};

TEST_F(OpeningABatch, SelectsTheRowsOfTheCandidates) {
  add("/b");
  add("/c");
  add("/none");
  const auto handle = open_batch("path");
  EXPECT_THAT(paths(handle.get()), UnorderedElementsAre("/b", "/c"));
  EXPECT_THAT(sent_statements(),
              ElementsAre("SELECT path FROM photo WHERE path in ('/b','/c','/none')  "));
}

TEST_F(OpeningABatch, PassesItsOtherClausesOn) {
  add("/b");
  add("/c");
  const auto handle = open_batch("path", "path", "path", "path DESC", 1, 1);
  EXPECT_THAT(paths(handle.get()), ElementsAre("/b"));
  EXPECT_THAT(sent_statements(),
              ElementsAre("SELECT path FROM photo WHERE path in ('/b','/c') GROUP BY path "
                          "ORDER BY path DESC"));
}

TEST_F(OpeningABatch, EscapesItsCandidates) {
  rows("INSERT INTO photo(path) VALUES('/it''s'), ('/%'), ('/back\\slash')");
  add("/it's");
  add("/%");
  add("/back\\slash");
  add("') OR (path <> '");
  EXPECT_THAT(paths(open_batch().get()), UnorderedElementsAre("/it's", "/%", "/back\\slash"));
}

TEST_F(OpeningABatch, GrowsItsConditionForAThousandCandidates) {
  std::string condition = "path in (";
  for (int i = 0; i < 1000; ++i) {
    const auto path = "/folder of some length/it's " + std::to_string(i);
    rows("INSERT INTO photo(path) VALUES(" + quoted(path) + ")");
    add(path);
    condition += quoted(path) + (i < 999 ? "," : ")");
  }
  ASSERT_GT(condition.size(), 2U * 16384U);
  const auto handle = open_batch("path");
  ASSERT_NE(handle, nullptr);
  EXPECT_EQ(handle->rowCount, 1000U);
  EXPECT_THAT(sent_statements(), ElementsAre("SELECT path FROM photo WHERE " + condition + "  "));
}

TEST_F(OpeningABatch, GrowsItsConditionForOneLongCandidate) {
  const std::string path(100000, '\'');
  rows("INSERT INTO photo(path) VALUES(" + quoted("/short") + ")");
  add(path);
  add("/short");
  EXPECT_THAT(paths(open_batch().get()), ElementsAre("/short"));
}

TEST_F(OpeningABatch, LosesNothingWhereItsFirstBufferEnds) {
  const auto taken = std::string("path in ('").size();
  for (std::size_t length = 16370; length < 16392; ++length) {
    SCOPED_TRACE(length);
    const auto path = "/" + std::string(length - taken - 1, 'x');
    const OwnedList two(TLIBCSzListAlloc(512));
    MediaInfoDBBatchPara(two.get(), path.c_str());
    MediaInfoDBBatchPara(two.get(), "/b");
    const Handle handle(
        MediaInfoDBBatchOpen(MEDIA_TABLE_PHOTO, nullptr, "path", two.get(), nullptr, nullptr, 0, 0),
        MediaInfoDBBatchClose);
    EXPECT_THAT(paths(handle.get()), ElementsAre("/b"));
    EXPECT_EQ(last_statement(), "SELECT * FROM photo WHERE path in ('" + path + "','/b')  ");
  }
}

TEST_F(OpeningABatch, FailsWithoutCandidates) {
  EXPECT_EQ(open_batch(), nullptr);
  EXPECT_EQ(
      last_log_line(),
      parens("MediaInfoDBOpenEx(2, (null), path in (), (null), (null), 0, 0, 0, TRUE) failed"));
}

TEST_F(OpeningABatch, RefusesAMissingFieldOrList) {
  EXPECT_EQ(open_batch(nullptr, nullptr), nullptr);
  EXPECT_EQ(
      MediaInfoDBBatchOpen(MEDIA_TABLE_PHOTO, nullptr, "path", nullptr, nullptr, nullptr, 0, 0),
      nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad parameter."), parens("Bad parameter.")));
}

TEST_F(OpeningABatch, RefusesAFieldLongerThanItsBuffer) {
  add("/b");
  EXPECT_EQ(open_batch(nullptr, std::string(16384, 'f').c_str()), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Bad field name.")));
}

TEST_F(OpeningABatch, LogsItsArgumentsWhenItFails) {
  add("/b");
  EXPECT_EQ(open_batch("nonsense", "path", "g", "o", 3, 4), nullptr);
  ASSERT_EQ(log_lines().size(), 2U);
  EXPECT_THAT(log_lines()[0], StartsWith(parens("Failed to exec [SELECT nonsense FROM photo ")));
  EXPECT_EQ(log_lines()[1],
            parens("MediaInfoDBOpenEx(2, nonsense, path in ('/b'), g, o, 3, 4, 0, TRUE) failed"));
}

TEST_F(OpeningABatch, FailsWhenACandidateCannotBeEscaped) {
  add("/b");
  add("/c");
  const Failing escape("TAVODBEscapeString", 2);
  EXPECT_EQ(open_batch(), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to escape string.")));
}

#ifdef MEDIIDX_ALLOCATIONS_CAN_FAIL
TEST_F(OpeningABatch, FailsWithoutMemoryForItsCondition) {
  add("/b");
  const FailingAllocation allocation(Allocator::kMalloc, 16384);
  EXPECT_EQ(open_batch(), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to allocate memory (16384)")));
}

TEST_F(OpeningABatch, FailsWithoutMemoryForACandidate) {
  add(std::string(1234, 'x'));
  const FailingAllocation allocation(Allocator::kMalloc, 2 * 1234 + 1);
  EXPECT_EQ(open_batch(), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to allocate memory (2469)")));
}

TEST_F(OpeningABatch, FailsWithoutMemoryToGrow) {
  add(std::string(17000, 'x'));
  const FailingAllocation allocation(Allocator::kRealloc, 2 * 16384);
  EXPECT_EQ(open_batch(), nullptr);
  EXPECT_THAT(log_lines(), ElementsAre(parens("Failed to realloc buffer.")));
}
#endif

class ClosingABatch : public Batch {};

TEST_F(ClosingABatch, IgnoresNull) {
  MediaInfoDBBatchClose(nullptr);
  EXPECT_THAT(log_lines(), IsEmpty());
}

class FindingInABatch : public Batch {
 protected:
  FindingInABatch() {
    add("/Ünder/a");
    add("/b");
    add("/c");
    handle = open_batch();
  }
  int find(const char* field, const char* text) {
    return MediaInfoDBBatchFind(handle.get(), field, text, &info);
  }

  Handle handle{nullptr, MediaInfoDBBatchClose};
  Info info{};
};

TEST_F(FindingInABatch, ReadsTheRowOfAValue) {
  ASSERT_EQ(find("path", "/b"), 0);
  EXPECT_STREQ(info.path, "/b");
  EXPECT_STREQ(info.title, "two");
}

TEST_F(FindingInABatch, IsBlindToCase) {
  ASSERT_EQ(find("path", "/üNDER/A"), 0);
  EXPECT_STREQ(info.path, "/Ünder/a");
}

TEST_F(FindingInABatch, BeginsAgainEachTime) {
  EXPECT_EQ(find("path", "/c"), 0);
  EXPECT_EQ(find("path", "/b"), 0);
  EXPECT_EQ(find("path", "/b"), 0);
  EXPECT_STREQ(info.path, "/b");
}

TEST_F(FindingInABatch, TakesANullFieldAsEmpty) {
  ASSERT_EQ(find("title", ""), 0);
  EXPECT_STREQ(info.path, "/c");
}

TEST_F(FindingInABatch, FindsNothingThatNoRowHas) {
  EXPECT_EQ(find("path", "/d"), -1);
  EXPECT_EQ(find("nonsense", "/b"), -1);
  EXPECT_THAT(log_lines(), IsEmpty());
}

TEST_F(FindingInABatch, FindsNothingAmongNoRows) {
  const auto empty = open(MEDIA_TABLE_VIDEO);
  EXPECT_EQ(MediaInfoDBBatchFind(empty.get(), "path", "/b", &info), -1);
}

TEST_F(FindingInABatch, RefusesMissingArguments) {
  EXPECT_EQ(MediaInfoDBBatchFind(nullptr, "path", "/b", &info), -1);
  EXPECT_EQ(find(nullptr, "/b"), -1);
  EXPECT_EQ(find("path", nullptr), -1);
  EXPECT_EQ(MediaInfoDBBatchFind(handle.get(), "path", "/b", nullptr), -1);
  EXPECT_THAT(log_lines(), testing::Each(parens("Bad parameter.")));
}

class FindingByHash : public FindingInABatch {
 protected:
  int find_by_hash(const char* key) {
    return MediaInfoDBHashFind(handle.get(), "not read", key, &info, hash.get());
  }
};

TEST_F(FindingByHash, ReadsTheRowOfAKey) {
  ASSERT_EQ(MediaInfoDBGenHash(handle.get(), "path", hash.get()), 0);
  for (const char* path : {"/c", "/Ünder/a", "/b", "/c"}) {
    ASSERT_EQ(find_by_hash(path), 0);
    EXPECT_STREQ(info.path, path);
  }
}

TEST_F(FindingByHash, CountsRowsFromZeroWhereverTheHandleStood) {
  Info walked;
  MediaInfoDBGet(handle.get(), &walked);
  ASSERT_EQ(MediaInfoDBGenHash(handle.get(), "path", hash.get()), 0);
  EXPECT_EQ(TLIBCSzHashCount(hash.get()), 3);
  EXPECT_STREQ(TLIBCSzHashGetValue(hash.get(), walked.path), "0");
}

TEST_F(FindingByHash, TakesANullFieldAsEmpty) {
  ASSERT_EQ(MediaInfoDBGenHash(handle.get(), "title", hash.get()), 0);
  ASSERT_EQ(find_by_hash(""), 0);
  EXPECT_STREQ(info.path, "/c");
}

TEST_F(FindingByHash, FindsNothingForAnUnknownKey) {
  MediaInfoDBGenHash(handle.get(), "path", hash.get());
  EXPECT_EQ(find_by_hash("/d"), -1);
}

TEST_F(FindingByHash, FindsNothingForARowThatIsNotThere) {
  TLIBCSzHashSetValue(hash.get(), "/d", "3");
  EXPECT_EQ(find_by_hash("/d"), -1);
}

TEST_F(FindingByHash, FillsNothingFromNoRows) {
  const auto empty = open(MEDIA_TABLE_VIDEO);
  EXPECT_EQ(MediaInfoDBGenHash(empty.get(), "path", hash.get()), 0);
  EXPECT_EQ(TLIBCSzHashCount(hash.get()), 0);
}

TEST_F(FindingByHash, FailsWhenTheHashDoes) {
  const Failing set_value("TLIBCSzHashSetValue", 2);
  EXPECT_EQ(MediaInfoDBGenHash(handle.get(), "path", hash.get()), -1);
  EXPECT_THAT(log_lines(), ElementsAre("mediidx_database(N)TLIBCSzHashSetValue failed"));
}

TEST_F(FindingByHash, RefusesMissingArguments) {
  EXPECT_EQ(MediaInfoDBGenHash(nullptr, "path", hash.get()), -1);
  EXPECT_EQ(MediaInfoDBGenHash(handle.get(), nullptr, hash.get()), -1);
  EXPECT_EQ(MediaInfoDBGenHash(handle.get(), "path", nullptr), -1);
  EXPECT_EQ(MediaInfoDBHashFind(nullptr, "path", "/b", &info, hash.get()), -1);
  EXPECT_EQ(find_by_hash(nullptr), -1);
  EXPECT_EQ(MediaInfoDBHashFind(handle.get(), "path", "/b", nullptr, hash.get()), -1);
  EXPECT_EQ(MediaInfoDBHashFind(handle.get(), "path", "/b", &info, nullptr), -1);
  EXPECT_THAT(log_lines(), testing::Each(parens("Bad parameter.")));
  EXPECT_EQ(log_lines().size(), 7U);
}

}  // namespace
}  // namespace mediidx::test
