// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Random batches on one database, their records one by one on the other: both come out the same.
#include "library.h"

namespace mediidx::test {
namespace {

constexpr int kSequences = 24;  // for each seed
constexpr int kSteps = 12;

class Batches : public TwinTest, public testing::WithParamInterface<unsigned> {
 protected:
  enum class Kind { kGood, kAnything };

  void run_sequence(RandomLibrary& library, Kind kind);

 private:
  template <class Make>
  auto several(RandomLibrary& library, Make make) {
    std::vector<decltype(make())> records;
    for (unsigned i = library.below(6) + 1; i > 0; --i) records.push_back(make());
    return records;
  }
  Given step(RandomLibrary& library, Kind kind);
  Given add_records(std::vector<Info> records, MEDIA_TABLE_TYPE type, RandomLibrary& library,
                    Kind kind);
  void remove(const std::string& path);
};

Given Batches::add_records(std::vector<Info> records, MEDIA_TABLE_TYPE type, RandomLibrary& library,
                           Kind kind) {
  for (auto& record : records) {
    if (kind == Kind::kAnything && library.one_in(12)) library.spoil(record);
  }
  return add_to_both(records, type);
}

/// The files of the index are not there, so that a delete is taken; but cue sheets are.
void Batches::remove(const std::string& path) {
  for (const auto side : {Side::kOneByOne, Side::kTogether}) {
    use(side);
    TAVOMediaIndexDelete(path.c_str());
  }
}

Given Batches::step(RandomLibrary& library, Kind kind) {
  switch (library.below(11)) {
    case 0:
      return add_records(several(library, [&] { return library.video(); }), MEDIA_TABLE_VIDEO,
                         library, kind);
    case 1:
      return add_records(several(library, [&] { return library.photo(); }), MEDIA_TABLE_PHOTO,
                         library, kind);
    case 2:
      return add_to_both(several(library, [&] { return library.folder(); }));
    case 3:
    case 4: {
      Json::Value array(Json::arrayValue);
      for (auto& song : several(library, [&] { return library.json_song(); })) array.append(song);
      return add_to_both(array, MEDIA_TABLE_MUSIC);
    }
    case 5:
    case 6:
    case 7:
      library.write_cue_sheets(kind == Kind::kAnything && library.one_in(2));
      return add_records(several(library, [&] { return library.playlist(); }), MEDIA_TABLE_PLAYLIST,
                         library, kind);
    case 8:
      remove(library.any_path());
      return {};
    default:
      return add_records(several(library, [&] { return library.song(); }), MEDIA_TABLE_MUSIC,
                         library, kind);
  }
}

void Batches::run_sequence(RandomLibrary& library, Kind kind) {
  empty_both();
  library.write_files();
  for (int i = 0; i < kSteps && !HasFailure(); ++i) {
    SCOPED_TRACE("step " + std::to_string(i));
    const auto given = step(library, kind);
    if (kind == Kind::kGood) {
      EXPECT_FALSE(fell_back(given)) << testing::PrintToString(given.log);
    }
  }
  expect_same_content();
}

TEST_P(Batches, LeaveTheRowsOfSingleAdds) {
  RandomLibrary library(root, GetParam());
  for (int i = 0; i < kSequences && !HasFailure(); ++i) {
    SCOPED_TRACE("sequence " + std::to_string(i));
    run_sequence(library, Kind::kGood);
  }
}

TEST_P(Batches, ThatTheDatabaseRefusesLeaveThemToo) {
  RandomLibrary library(root, 1000 + GetParam());
  for (int i = 0; i < kSequences / 4 && !HasFailure(); ++i) {
    SCOPED_TRACE("sequence " + std::to_string(i));
    run_sequence(library, Kind::kAnything);
  }
}

INSTANTIATE_TEST_SUITE_P(Seeds, Batches, testing::Range(1U, 7U));

}  // namespace
}  // namespace mediidx::test
