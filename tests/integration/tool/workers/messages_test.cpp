// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "workers/messages.h"

#include <gtest/gtest.h>

#include <limits>

#include "text/utf8.h"

namespace mediidx::tool {
namespace {

using Outcome = TagAnswer::Outcome;

const TagOrder kOrder{77, "/music/a.mp3", Kind::kMusic};

constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
constexpr double kInfinity = std::numeric_limits<double>::infinity();

/// Every field has a value of its own.
TagAnswer full_answer() {
  TagAnswer answer;
  answer.ticket = kOrder.ticket;
  answer.outcome = Outcome::kRead;
  answer.before = {1234567890123, -5, 999'999'999};
  answer.after = {1234567890124, 1'700'000'000, 0};
  auto& file = answer.file;
  file = {kOrder.path,
          kOrder.kind,
          "title",
          "album",
          "artist",
          "album artist",
          "genre",
          "composer",
          "comment",
          "make",
          "model",
          "1/125",
          "f/2.8",
          "2004-05-01 12:00:00",
          "2004-05-02 12:00:00",
          "2004-05-03 12:00:00",
          "h264",
          "mp4",
          "aac",
          "1234-ABCD",
          1,
          2,
          2004,
          3.5,
          4,
          5,
          6,
          7,
          8,
          9,
          10,
          11,
          12,
          13,
          14,
          15,
          16,
          17'000'000'000,
          {-1.5, 0.25, std::nullopt, 0.75}};
  return answer;
}

TagAnswer failure(Outcome outcome, int error, const char* reason) {
  TagAnswer answer;
  answer.ticket = kOrder.ticket;
  answer.outcome = outcome;
  answer.error = error;
  answer.reason = reason;
  return answer;
}

std::string message_of(const TagAnswer& answer) {
  std::string out;
  put_answer(out, answer);
  std::string_view rest = out;
  const auto message = take_message(rest);
  EXPECT_TRUE(message && rest.empty());
  return std::string(message.value_or(""));
}

bool is_refused(const TagAnswer& answer) {
  try {
    read_answer(message_of(answer), kOrder);
  } catch (const MessageError&) {
    return true;
  }
  return false;
}

TEST(AnAnswer, ComesOutAsItWentIn) {
  const auto sent = full_answer();
  const auto read = read_answer(message_of(sent), kOrder);
  EXPECT_EQ(read.ticket, sent.ticket);
  EXPECT_EQ(read.outcome, sent.outcome);
  EXPECT_EQ(read.before, sent.before);
  EXPECT_EQ(read.after, sent.after);
  EXPECT_EQ(to_json(read.file), to_json(sent.file));
  EXPECT_EQ(read.file.kind, sent.file.kind);
}

TEST(AnAnswer, SaysWhyAFileIsUnreadable) {
  const auto read = read_answer(message_of(failure(Outcome::kUnreadable, 13, "not ours")), kOrder);
  EXPECT_EQ(read.outcome, Outcome::kUnreadable);
  EXPECT_EQ(read.error, 13);
  EXPECT_EQ(read.reason, "not ours");
}

TEST(AnAnswer, IsOfThePathAndKindOfItsOrder) {
  const TagOrder order{77, "/films/\xFF\n.mkv", Kind::kVideo};
  const auto read = read_answer(message_of(full_answer()), order);
  EXPECT_EQ(read.file.path, order.path);
  EXPECT_EQ(read.file.kind, order.kind);
}

TEST(AnAnswer, ToAnotherOrderIsRefused) {
  auto answer = full_answer();
  ++answer.ticket;
  EXPECT_TRUE(is_refused(answer));
}

TEST(AnAnswer, CutAnywhereIsRefused) {
  const auto message = message_of(full_answer());
  for (std::size_t length = 0; length < message.size(); ++length) {
    EXPECT_THROW(read_answer(std::string_view(message).substr(0, length), kOrder), MessageError)
        << length;
  }
}

TEST(AnAnswer, WithBytesBehindItsEndIsRefused) {
  EXPECT_THROW(read_answer(message_of(full_answer()) + '\0', kOrder), MessageError);
}

TEST(AnAnswer, WithAChangedByteIsRefusedOrAsAWorkerMaySendIt) {
  const auto message = message_of(full_answer());
  int refused = 0;
  for (std::size_t i = 0; i < message.size(); ++i) {
    auto changed = message;
    changed[i] = static_cast<char>(changed[i] ^ 0x80);
    try {
      const auto read = read_answer(changed, kOrder);
      EXPECT_TRUE(message_of(read) == changed) << i;
    } catch (const MessageError&) {
      ++refused;
    }
  }
  EXPECT_GT(refused, 100);
}

struct BadText {
  const char* name;
  std::string text;
};
class ATextOfAnAnswer : public testing::TestWithParam<BadText> {};

TEST_P(ATextOfAnAnswer, IsRefusedUnlessItIsClean) {
  auto answer = full_answer();
  answer.file.composer = GetParam().text;
  EXPECT_TRUE(is_refused(answer));
  EXPECT_TRUE(is_refused(failure(Outcome::kDamaged, 0, GetParam().text.c_str())));
}

INSTANTIATE_TEST_SUITE_P(Cases, ATextOfAnAnswer,
                         testing::Values(BadText{"NotUtf8", "caf\xE9"},
                                         BadText{"ControlCharacter", "a\x1B[2Jb"},
                                         BadText{"LineEnd", "a\nb"},
                                         BadText{"Long", std::string(kLongestText + 1, 'x')}),
                         [](const auto& test) { return test.param.name; });

TEST(ANumberOfAnAnswer, IsRefusedUnlessAFileCanHaveIt) {
  const auto with = [](auto change) {
    auto answer = full_answer();
    change(answer);
    return is_refused(answer);
  };
  EXPECT_TRUE(with([](auto& answer) { answer.file.duration = kNan; }));
  EXPECT_TRUE(with([](auto& answer) { answer.file.duration = kInfinity; }));
  EXPECT_TRUE(with([](auto& answer) { answer.file.duration = -1; }));
  EXPECT_TRUE(with([](auto& answer) { answer.file.year = -1; }));
  EXPECT_TRUE(with([](auto& answer) { answer.file.filesize = -1; }));
  EXPECT_TRUE(with([](auto& answer) { answer.file.gain.album_gain = kNan; }));
  EXPECT_TRUE(with([](auto& answer) { answer.file.gain.track_peak = 1e9; }));
  EXPECT_TRUE(with([](auto& answer) { answer.before.size = -1; }));
  EXPECT_TRUE(with([](auto& answer) { answer.after.nanoseconds = 1'000'000'000; }));
  EXPECT_TRUE(with([](auto& answer) { answer.file.gain.track_gain = -kInfinity; }));
}

TEST(AFailure, IsRefusedUnlessItIsOneOfAWorker) {
  EXPECT_FALSE(is_refused(failure(Outcome::kDamaged, 0, "torn")));
  EXPECT_TRUE(is_refused(failure(Outcome::kLost, 0, "lost")));
  EXPECT_TRUE(is_refused(failure(Outcome::kDamaged, 5, "torn")));
  EXPECT_TRUE(is_refused(failure(Outcome::kDamaged, 0, "")));
  EXPECT_TRUE(is_refused(failure(Outcome::kUnreadable, 0, "refused")));
  EXPECT_TRUE(is_refused(failure(Outcome::kUnreadable, -5, "refused")));
  EXPECT_TRUE(is_refused(failure(Outcome::kUnreadable, 1'000'000, "refused")));
}

TEST(AMessage, IsTakenOnceItIsWhole) {
  std::string bytes;
  put_text(bytes, "one");
  put_text(bytes, "two");
  std::string_view rest = std::string_view(bytes).substr(0, bytes.size() - 1);
  EXPECT_EQ(take_message(rest), "one");
  EXPECT_EQ(take_message(rest), std::nullopt);
  rest = std::string_view(bytes).substr(bytes.size() - rest.size() - 1);
  EXPECT_EQ(take_message(rest), "two");
  EXPECT_TRUE(rest.empty());
}

TEST(AMessage, ThatIsTooLongIsRefusedByItsLength) {
  std::string_view bytes("\xFF\xFF\xFF\xFF", 4);
  EXPECT_THROW(take_message(bytes), MessageError);
}

TEST(AnOrder, TakesAnyPath) {
  const TagOrder order{1, std::string("/a\nb\xFF\x01 ", 7) + std::string(5000, '/'), Kind::kPhoto};
  std::string bytes;
  put_order(bytes, order);
  std::string_view rest = bytes;
  const auto read = read_order(take_message(rest).value_or(""));
  EXPECT_EQ(read.ticket, order.ticket);
  EXPECT_EQ(read.path, order.path);
  EXPECT_EQ(read.kind, order.kind);
}

TEST(AFile, IsMadeSendable) {
  auto answer = full_answer();
  auto& file = answer.file;
  file.comment = "x";
  for (std::size_t i = 0; i < kLongestText; ++i) file.comment += "\xC3\xA9";
  file.title = "a\nb\xFF";
  file.duration = -3;
  file.channel = -1;
  file.gain.track_peak = kNan;
  make_sendable(file);
  EXPECT_FALSE(is_refused(answer));
  EXPECT_EQ(file.comment.size(), kLongestText - 1);
  EXPECT_TRUE(is_utf8(file.comment));
  EXPECT_EQ(file.title, "a b\xEF\xBF\xBD");
  EXPECT_EQ(file.duration, 0);
  EXPECT_EQ(file.channel, 0);
  EXPECT_EQ(file.gain.track_peak, std::nullopt);
  EXPECT_EQ(file.album, "album");
}

}  // namespace
}  // namespace mediidx::tool
