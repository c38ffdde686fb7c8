// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Looking many rows up at once: by a list of candidates, or by a hash from a value to a row.
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "database/session.h"
#include "support/no_throw.h"

namespace mediidx {
namespace {

using Info = __tag_TAVO_MEDIA_INFO;

constexpr std::size_t kFirstSize = 16384;

constexpr int kBadCandidate = 300;
constexpr int kNotPushed = 301;
constexpr int kNoBuffer = 302;
constexpr int kNoMemory = 303;
constexpr int kNotEscaped = 304;
constexpr int kNotGrown = 305;
constexpr int kNotOpened = 306;
constexpr int kNotHashed = 307;
constexpr int kBadParameter = 308;
constexpr int kFieldTooLong = 309;

int bad_parameter() {
  kDatabaseLog.parens(kBadParameter, "Bad parameter.");
  return -1;
}

/// "FIELD in ('a','b')", in a buffer that doubles as it fills.
class InCondition {
 public:
  bool begin(const char* field) {
    buffer_.reset(static_cast<char*>(std::malloc(kFirstSize)));
    if (!buffer_) {
      kDatabaseLog.parens(kNoBuffer, "Failed to allocate memory (%d)",
                          static_cast<int>(kFirstSize));
      return false;
    }
    const int written = std::snprintf(buffer_.get(), size_, "%s in (", field);
    if (written < 0 || static_cast<std::size_t>(written) >= size_) {
      kDatabaseLog.parens(kFieldTooLong, "Bad field name.");
      return false;
    }
    used_ = static_cast<std::size_t>(written);
    return true;
  }

  bool add(const char* candidate) {
    const auto length = std::strlen(candidate);
    const auto bytes = 2 * length + 1;
    const OwnedText escaped(static_cast<char*>(std::malloc(bytes)));
    if (!escaped) {
      kDatabaseLog.parens(kNoMemory, "Failed to allocate memory (%d)", static_cast<int>(bytes));
      return false;
    }
    if (TAVODBEscapeString(escaped.get(), candidate, length) == -1) {
      kDatabaseLog.parens(kNotEscaped, "Failed to escape string.");
      return false;
    }
    constexpr std::size_t kQuotesCommaEnd = 4;
    if (!make_room(std::strlen(escaped.get()) + kQuotesCommaEnd)) return false;
    used_ += static_cast<std::size_t>(
        std::snprintf(buffer_.get() + used_, size_ - used_, "'%s',", escaped.get()));
    return true;
  }

  /// The finished condition; without candidates it has none to compare with, and no database takes
  /// it.
  const char* end() {
    if (buffer_.get()[used_ - 1] == ',') --used_;
    buffer_.get()[used_] = ')';
    buffer_.get()[used_ + 1] = '\0';
    return buffer_.get();
  }

 private:
  bool make_room(std::size_t wanted) {
    auto size = size_;
    while (size - used_ < wanted) size *= 2;
    if (size == size_) return true;
    auto* grown = static_cast<char*>(std::realloc(buffer_.get(), size));
    if (!grown) {
      kDatabaseLog.parens(kNotGrown, "Failed to realloc buffer.");
      return false;
    }
    static_cast<void>(buffer_.release());
    buffer_.reset(grown);
    size_ = size;
    return true;
  }

  OwnedText buffer_;
  std::size_t size_ = kFirstSize;
  std::size_t used_ = 0;
};

struct BatchQuery {
  MEDIA_TABLE_TYPE type;
  const char* columns;
  const char* field;
  TLIBSZLIST* candidates;
  const char* group_by;
  const char* order_by;
  std::uint32_t range_a;
  std::uint32_t range_b;
};

OwnedHandle open_batch(const BatchQuery& query) {
  if (!query.field || !query.candidates) {
    bad_parameter();
    return nullptr;
  }
  InCondition condition;
  if (!condition.begin(query.field)) return nullptr;
  const int candidates = TLIBCSzListCount(query.candidates);
  for (int i = 0; i < candidates; ++i) {
    if (!condition.add(TLIBCSzListGet(query.candidates, i))) return nullptr;
  }
  const char* where = condition.end();
  OwnedHandle handle(MediaInfoDBOpenEx(query.type, query.columns, where, query.group_by,
                                       query.order_by, query.range_a, query.range_b, 0));
  if (!handle) {
    kDatabaseLog.parens(kNotOpened, "MediaInfoDBOpenEx(%d, %s, %s, %s, %s, %d, %d, 0, TRUE) failed",
                        static_cast<int>(query.type), shown(query.columns), where,
                        shown(query.group_by), shown(query.order_by),
                        static_cast<int>(query.range_a), static_cast<int>(query.range_b));
  }
  return handle;
}

int push(TLIBSZLIST* candidates, const char* candidate) {
  if (!candidates || !candidate) {
    kDatabaseLog.parens(kBadCandidate, "pCandidateList=%p, szCandidate=%s",
                        static_cast<void*>(candidates), shown(candidate));
    return -1;
  }
  const int result = TLIBCSzListPush(candidates, candidate);
  if (result < 0) {
    kDatabaseLog.parens(kNotPushed, "Failed to TLIBCSzListPush(%p, %s).",
                        static_cast<void*>(candidates), candidate);
  }
  return result;
}

/// The field's text in the current row, empty when null.
const char* field_text(const MEDIA_DB_HANDLE& handle, const char* field) {
  const char* text = TAVODBFetchField(handle.result, handle.row, field);
  return text ? text : "";
}

bool fetch(MEDIA_DB_HANDLE& handle) { return TAVODBFetchRow(handle.result, &handle.row) != -1; }

int find(MEDIA_DB_HANDLE* handle, const char* field, const char* value, Info* info) {
  if (!handle || !field || !value || !info) return bad_parameter();
  if (TAVODBSetRowCursor(handle->result, 0) == -1) return -1;
  while (fetch(*handle)) {
    if (TLIBCUnicodeUTF8StrCaseCmp(field_text(*handle, field), value) == 0) {
      return MediaInfoDBGetRecored(handle, info);
    }
  }
  return -1;
}

int fill_hash(MEDIA_DB_HANDLE* handle, const char* field, TLIBSZHASH* hash) {
  if (!handle || !field || !hash) return bad_parameter();
  if (TAVODBSetRowCursor(handle->result, 0) == -1) return 0;  // no rows
  for (unsigned row = 0; fetch(*handle); ++row) {
    char number[16];
    std::snprintf(number, sizeof(number), "%u", row);
    if (TLIBCSzHashSetValue(hash, field_text(*handle, field), number) < 0) {
      kDatabaseLog.tight(kNotHashed, "TLIBCSzHashSetValue failed");
      return -1;
    }
  }
  return 0;
}

int find_in_hash(MEDIA_DB_HANDLE* handle, const char* key, Info* info, TLIBSZHASH* hash) {
  if (!handle || !key || !info || !hash) return bad_parameter();
  const char* number = TLIBCSzHashGetValue(hash, key);
  if (!number) return -1;
  const auto row = static_cast<std::uint32_t>(std::strtol(number, nullptr, 10));
  if (TAVODBSetRowCursor(handle->result, row) == -1 || !fetch(*handle)) return -1;
  return MediaInfoDBGetRecored(handle, info);
}

}  // namespace
}  // namespace mediidx

using mediidx::kDatabaseLog;
using mediidx::no_throw;

extern "C" int MediaInfoDBBatchPara(TLIBSZLIST* candidates, const char* candidate) {
  return no_throw(kDatabaseLog, -1, [&] { return mediidx::push(candidates, candidate); });
}

extern "C" MEDIA_DB_HANDLE* MediaInfoDBBatchOpen(MEDIA_TABLE_TYPE tableType, const char* columns,
                                                 const char* field, TLIBSZLIST* candidates,
                                                 const char* groupBy, const char* orderBy,
                                                 uint32_t rangeA, uint32_t rangeB) {
  return no_throw(kDatabaseLog, mediidx::OwnedHandle(),
                  [&] {
                    return mediidx::open_batch(
                        {tableType, columns, field, candidates, groupBy, orderBy, rangeA, rangeB});
                  })
      .release();
}

extern "C" int MediaInfoDBBatchFind(MEDIA_DB_HANDLE* handle, const char* field, const char* value,
                                    __tag_TAVO_MEDIA_INFO* info) {
  return no_throw(kDatabaseLog, -1, [&] { return mediidx::find(handle, field, value, info); });
}

extern "C" int MediaInfoDBGenHash(MEDIA_DB_HANDLE* handle, const char* field, TLIBSZHASH* hash) {
  return no_throw(kDatabaseLog, -1, [&] { return mediidx::fill_hash(handle, field, hash); });
}

extern "C" int MediaInfoDBHashFind(MEDIA_DB_HANDLE* handle, const char* /*field*/, const char* key,
                                   __tag_TAVO_MEDIA_INFO* info, TLIBSZHASH* hash) {
  return no_throw(kDatabaseLog, -1, [&] { return mediidx::find_in_hash(handle, key, info, hash); });
}

extern "C" void MediaInfoDBBatchClose(MEDIA_DB_HANDLE* handle) { MediaInfoDBClose(handle); }
