// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// The frame of a scan, and its second half: doing what was planned.
#include "scan/scanner.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <tavoindex.h>
#include <tavosdk.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <filesystem>
#include <memory>
#include <thread>

#include "mediidx/database.h"
#include "mediidx/request.h"
#include "store/query.h"
#include "support/text.h"
#include "tags/file_times.h"
#include "tags/volume_id.h"

namespace mediidx::tool {
namespace {

namespace fs = std::filesystem;

constexpr int kPage = 500;
// Of the order of a megabyte as it is handed over, and more saves little.
constexpr std::size_t kBatch = 250;
// The workers go on while a batch is written.
constexpr std::size_t kInFlight = 2 * kBatch;
constexpr auto kPatience = std::chrono::seconds(60);
constexpr auto kBetweenTries = std::chrono::milliseconds(500);
// The kernel's clock of files ticks every few milliseconds: a file written twice within a tick, and
// read between, would look unchanged.
constexpr std::int64_t kTick = 50'000'000;

std::string name_of(const std::string& path) { return path.substr(path.rfind('/') + 1); }

std::int64_t now() {
  timespec time{};
  clock_gettime(CLOCK_REALTIME, &time);
  return std::int64_t{time.tv_sec} * 1'000'000'000 + time.tv_nsec;
}

FileStamp stamp_of(const std::string& path) {
  struct stat status{};
  if (stat(path.c_str(), &status) != 0) return {};
  return {status.st_size, status.st_mtim.tv_sec, static_cast<std::int32_t>(status.st_mtim.tv_nsec)};
}

/// The kernel grants a lease on a file only when nobody has it open for writing. To other users'
/// files it may not be asked about: those count as written.
bool is_being_written(const std::string& path) {
  const int descriptor = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY);
  if (descriptor < 0) return false;
  const bool is_refused = fcntl(descriptor, F_SETLEASE, F_RDLCK) != 0 && errno == EAGAIN;
  close(descriptor);
  return is_refused;
}

/// Playlists and cue sheets have no tags: only the file system is asked.
TagAnswer read_here(const Change& change) {
  TagAnswer answer;
  answer.before = stamp_of(change.path);
  try {
    answer.file = read_media_file(change.path, change.kind);
    answer.outcome = TagAnswer::Outcome::kRead;
  } catch (const ReadError& error) {
    answer.outcome = TagAnswer::Outcome::kUnreadable;
    answer.error = access(change.path.c_str(), R_OK) == 0 ? EIO : errno;
    answer.reason = error.what();
  }
  answer.after = stamp_of(change.path);
  return answer;
}

std::unique_ptr<DIR_INFO_REC> folder_record(const std::string& path, std::int64_t& modified) {
  auto record = std::make_unique<DIR_INFO_REC>();
  copy_text(record->path, path);
  copy_text(record->title, name_of(path));
  copy_text(record->fs_uuid, volume_id(path));
  struct statx status{};
  if (statx(AT_FDCWD, path.c_str(), 0, STATX_BASIC_STATS | STATX_BTIME, &status) == 0) {
    const auto times = file_times(status);
    copy_text(record->date, times.created);
    copy_text(record->mdate, times.modified);
    modified = status.stx_mtime.tv_sec * 1'000'000'000 + status.stx_mtime.tv_nsec;
  }
  return record;
}

auto one_by_one(const std::function<bool(const Change&)>& take) {
  return [take](std::span<const Change> changes) { return std::ranges::all_of(changes, take); };
}

}  // namespace

Scanner::Scanner(Database& database, const DataFolder& data, TagWorkers& workers,
                 ScanOptions options, ScanHooks hooks)
    : database_(database),
      data_(data),
      workers_(workers),
      options_(options),
      hooks_(std::move(hooks)),
      state_(database) {}

bool Scanner::stops() {
  report_.is_stopped = report_.is_stopped || hooks_.must_stop();
  return report_.is_stopped;
}

void Scanner::check_configuration() {
  if (hooks_.reload()) is_reconfigured_ = true;
}

ScanReport Scanner::run(const std::vector<std::string>& folders) {
  for (bool is_done = false; !is_done && !report_.is_stopped;) {
    try {
      run_once(folders);
      is_done = true;
      continue;
    } catch (const AlreadyRunning&) {
      throw;
    } catch (const DatabaseLost&) {
      if (options_.dry_run) throw;
      options_.trust_index = false;
    } catch (const std::runtime_error&) {
      if (options_.dry_run || state_.is_same_connection()) throw;
    }
    wait_for_database();
  }
  report_.skipped += report_.unstorable;
  report_.timings = timings_.seconds();
  return report_;
}

void Scanner::wait_for_database() {
  hooks_.say("the database does not answer: waiting for it");
  const auto deadline = std::chrono::steady_clock::now() + kPatience;
  while (!database_.reconnect()) {
    if (stops()) return;
    if (std::chrono::steady_clock::now() > deadline) {
      throw DatabaseLost("the database no longer answers: " + database_.last_error());
    }
    std::this_thread::sleep_for(kBetweenTries);
  }
  hooks_.say("the database is back");
}

void Scanner::run_once(const std::vector<std::string>& folders) {
  report_.skipped = 0;
  report_.switched_off = 0;
  report_.offline = 0;
  report_.is_away = false;
  report_.away_roots.clear();
  report_.is_refused = false;
  is_settling_ = false;
  is_reconfigured_ = false;
  away_.clear();
  batch_.clear();
  in_hand_.clear();
  while (workers_.outstanding() > 0) workers_.take(kBetweenTries);

  if (options_.dry_run) database_.run("BEGIN");
  state_.begin(options_.wait);
  {
    const Timings::Part part(timings_, Phase::kPlan);
    plan(starts_for(folders));
  }
  if (options_.dry_run) {
    count_plan();
    database_.run("ROLLBACK");
    state_.end();
    return;
  }
  if (!stops()) apply();
  if (!stops()) {
    const Timings::Part part(timings_, Phase::kSettle);
    settle();
  }
  if (!stops()) state_.count_tracks();
  state_.end();
}

// -- Doing ---------------------------------------------------------------------------------------

void Scanner::apply() {
  const auto total = static_cast<std::size_t>(state_.count_changes());
  hooks_.start(total);
  if (total == 0) return;
  {
    const Timings::Part part(timings_, Phase::kRemovals);
    apply_step(Step::kRemovals, one_by_one([this](const Change& change) { return remove(change); }),
               [this](const Change& change) {
                 const bool is_counted = !change.is_folder && change.what != What::kMovedAway;
                 if (is_counted && change.known != -1) ++report_.removed;
               });
    move_attributes();
  }
  {
    const Timings::Part part(timings_, Phase::kFolders);
    apply_step(
        Step::kFolders, [this](std::span<const Change> changes) { return save_folders(changes); },
        [this](const Change&) { ++report_.folders; });
  }
  for (const auto step : {Step::kMedia, Step::kPlaylists, Step::kCueSheets}) save_files(step);
}

void Scanner::roll_back() {
  try {
    database_.run("ROLLBACK");
  } catch (const std::runtime_error& error) {
    throw DatabaseLost(error.what());
  }
  check_connection();
}

/// What fails with the connection is the connection's failure, not a file's. A request may succeed
/// all the same: the statement that finds the connection lost fails, the next one has a new one,
/// and the transaction is gone with what it held. So nothing is noted as done before this was
/// asked.
void Scanner::check_connection() {
  if (!state_.is_same_connection()) throw DatabaseLost("the connection to the database was lost");
}

void Scanner::apply_step(Step step, const Take& take,
                         const std::function<void(const Change&)>& count) {
  std::int64_t after = 0;
  for (;;) {
    const auto page = state_.next(step, after, kPage);
    if (page.empty() || stops()) return;
    after = page.back().id;
    bool is_done = false;
    try {
      database_.run("BEGIN");
      is_done = take(page);
      if (is_done) {
        check_connection();
        database_.run("COMMIT");
      }
    } catch (const std::runtime_error&) {
      is_done = false;
    }
    if (!is_done) roll_back();
    for (const auto& change : page) {
      hooks_.step(change.path);
      if (is_done || take({&change, 1})) {
        count(change);
      } else {
        fail_in_database(change);
      }
    }
    check_configuration();
  }
}

bool Scanner::remove(const Change& change) {
  const auto& path = change.path;
  if (change.is_folder) {
    if (change.what == What::kLeftOut) {
      if (MediaInfoDBDelete(MEDIA_TABLE_DIRECTORY, path.c_str()) != 0) return false;
      state_.set_folder(change.folder, false, false, std::nullopt);
      return true;
    }
    // What is there again will be found again.
    const bool is_gone = change.what == What::kGoneFolder;
    const int result =
        is_gone ? TAVOMediaIndexDirDelete(path.c_str()) : TAVOMediaIndexPreReindex(path.c_str());
    if (result < 0) return false;
    state_.forget_folder(path);
    return true;
  }
  if (change.what == What::kMovedAway) return true;
  // The folder takes its files along, but not what its cue sheets cut out of files elsewhere.
  if (change.what == What::kGoneWith && change.kind != Kind::kCueSheet) return true;
  const bool is_there = look_at(path) != Presence::kGone;
  if (is_there && change.what == What::kGone) return true;
  const int result = is_there ? MediaInfoDBDelete(table_of(change.kind), path.c_str())
                              : TAVOMediaIndexDelete(path.c_str());
  if (result != 0) return false;
  if (change.what != What::kGoneWith) state_.forget_file(change.folder, name_of(path));
  return true;
}

void Scanner::move_attributes() {
  std::int64_t after = 0;
  for (;;) {
    const auto page = state_.moves(after, kPage);
    if (page.empty()) return;
    after = page.back().id;
    for (const auto& change : page) {
      std::array<char, MEDIIDX_PATH_SIZE> from{};
      std::array<char, MEDIIDX_PATH_SIZE> to{};
      const auto size = static_cast<int>(from.size() - 1);
      if (TAVOEADirPath(0, change.source.c_str(), from.data(), size) < 0 ||
          TAVOEADirPath(0, change.path.c_str(), to.data(), size) < 0) {
        continue;
      }
      std::error_code error;
      if (!fs::is_directory(from.data(), error) || fs::exists(to.data(), error)) continue;
      fs::create_directories(fs::path(to.data()).parent_path(), error);
      fs::rename(from.data(), to.data(), error);
      if (error) fail(change.path, "its ratings could not follow it: " + error.message());
    }
  }
}

bool Scanner::save_folders(std::span<const Change> changes) {
  std::vector<DIR_INFO_REC> records;
  std::vector<FolderState> states;
  for (const auto& change : changes) {
    FolderState state{change.folder, 0};
    const auto record = folder_record(change.path, state.modified);
    if (look_at(change.path) == Presence::kGone) continue;
    records.push_back(*record);
    states.push_back(state);
  }
  if (TAVOMediaIndexDirAddMany(records.data(), static_cast<unsigned>(records.size()), nullptr) !=
      0) {
    return false;
  }
  check_connection();
  state_.save_folders(states);
  return true;
}

void Scanner::save_files(Step step) {
  std::deque<Change> queue;
  std::int64_t after = 0;
  bool has_more = true;
  while (!stops()) {
    if (queue.empty() && has_more) {
      const Timings::Part part(timings_, Phase::kPlan);
      auto page = state_.next(step, after, kPage);
      has_more = !page.empty();
      if (has_more) after = page.back().id;
      std::ranges::move(page, std::back_inserter(queue));
    }
    const Timings::Part part(timings_, Phase::kTags);
    while (!queue.empty() && in_hand_.size() < kInFlight && batch_.size() < kBatch) {
      submit(std::move(queue.front()));
      queue.pop_front();
    }
    if (auto answer = in_hand_.empty() ? std::nullopt : workers_.take(kBetweenTries)) {
      if (auto found = in_hand_.extract(answer->ticket)) {
        receive({std::move(found.mapped()), std::move(*answer)});
      }
    }
    if (batch_.size() >= kBatch) write_batch();
    check_configuration();
    if (queue.empty() && !has_more && in_hand_.empty()) break;
  }
  write_batch();
  in_hand_.clear();
}

void Scanner::submit(Change change) {
  hooks_.step(change.path);
  if (is_reconfigured_ &&
      TAVOMediaIndexIsIndexPath(change.path.c_str(), table_of(change.kind)) <= 0) {
    ++report_.skipped;
    ++report_.switched_off;
    return;
  }
  if (options_.pass_over_open && is_being_written(change.path)) return;
  if (change.kind == Kind::kPlaylist || change.kind == Kind::kCueSheet) {
    auto answer = read_here(change);
    return receive({std::move(change), std::move(answer)});
  }
  const auto ticket = ++last_ticket_;
  workers_.submit({ticket, change.path, change.kind});
  in_hand_.emplace(ticket, std::move(change));
}

void Scanner::receive(Ready ready) {
  if (ready.answer.outcome == TagAnswer::Outcome::kUnreadable) {
    // What was deleted meanwhile is missed by the next scan. Of others the rows stay.
    if (ready.answer.error != ENOENT) fail(ready.change.path, ready.answer.reason);
    return;
  }
  batch_.push_back(std::move(ready));
}

void Scanner::write_batch() {
  // As planned, not as the workers came to it.
  std::ranges::sort(batch_, {}, [](const Ready& ready) { return ready.change.id; });
  write(batch_);
  batch_.clear();
}

/// Together; where that fails by halves, until the bad one is alone.
void Scanner::write(std::span<const Ready> files) {
  if (files.empty()) return;
  if (write_together(files)) {
    for (const auto& ready : files) count_saved(ready);
    return;
  }
  if (files.size() == 1) return write_alone(files.front());
  const auto half = files.size() / 2;
  write(files.first(half));
  write(files.subspan(half));
}

bool Scanner::write_together(std::span<const Ready> files) {
  const Timings::Part part(timings_, Phase::kLibrary);
  bool is_done = false;
  try {
    database_.run("BEGIN");
    // The library may have gone on over a new connection, without the transaction.
    is_done = save(files) && state_.is_same_connection();
    if (is_done) {
      const Timings::Part noting(timings_, Phase::kNote);
      std::vector<FileState> states;
      for (const auto& ready : files) states.push_back(state_of(ready));
      state_.save(states);
      const Timings::Part committing(timings_, Phase::kCommit);
      database_.run("COMMIT");
    }
  } catch (const std::runtime_error&) {
    is_done = false;
  }
  if (!is_done) roll_back();
  return is_done;
}

/// Without a transaction, as the library means its requests: a statement that fails costs itself.
void Scanner::write_alone(const Ready& ready) {
  const Timings::Part part(timings_, Phase::kLibrary);
  const auto& change = ready.change;
  if (change.folder != 0) state_.mark_unsure(change.folder, name_of(change.path));
  const bool is_saved = save({&ready, 1});
  auto state = state_of(ready);
  if (is_saved) {
    check_connection();
    count_saved(ready);
  } else {
    const auto reason = fail_in_database(change);
    // A sheet's text will not do better next time, unless it went away meanwhile.
    if (change.kind != Kind::kCueSheet || state.status.size < 0) return;
    state.failure = reason;
  }
  state_.save({&state, 1});
}

bool Scanner::save(std::span<const Ready> files) {
  std::map<MEDIA_TABLE_TYPE, Json::Value> added;
  for (const auto& ready : files) {
    const auto& change = ready.change;
    const bool is_read = ready.answer.outcome == TagAnswer::Outcome::kRead;
    if (is_read && change.what != What::kMoved) {
      added[table_of(change.kind)].append(to_json(ready.answer.file));
      continue;
    }
    if (!(is_read ? move(ready) : drop(ready))) return false;
    if (change.what == What::kMoved) state_.forget_path(change.source);
  }
  return std::ranges::all_of(added, [](const auto& files_of_table) {
    const auto& [table, array] = files_of_table;
    return TAVOMediaIndexAddMany_Json(array, table, nullptr) == 0;
  });
}

bool Scanner::move(const Ready& ready) {
  const auto& change = ready.change;
  // It reports a failure in any case; the rows tell.
  TAVOMediaIndexRename_Json(to_json(ready.answer.file), table_of(change.kind),
                            change.source.c_str());
  return is_in_index(change);
}

/// A file that can no longer be understood has no rows, as if it had always been so. Where its
/// reader was lost, by the file or by a disk that hangs, what was known of it stays.
bool Scanner::drop(const Ready& ready) {
  const auto& change = ready.change;
  if (change.what == What::kMoved && TAVOMediaIndexDelete(change.source.c_str()) != 0) return false;
  if (change.what == What::kNew || change.what == What::kMoved || change.known == -1) return true;
  if (ready.answer.outcome == TagAnswer::Outcome::kLost) return true;
  return MediaInfoDBDelete(table_of(change.kind), change.path.c_str()) == 0;
}

FileState Scanner::state_of(const Ready& ready) const {
  const auto& change = ready.change;
  const auto& answer = ready.answer;
  FileState out{change.folder, name_of(change.path), change.kind, change.status, {}};
  if (answer.outcome != TagAnswer::Outcome::kRead) {
    out.failure = answer.reason;
    return out;
  }
  const auto& before = answer.before;
  out.status.size = before.size;
  out.status.modified = before.seconds * 1'000'000'000 + before.nanoseconds;
  // The library reads a list itself, after the look at it.
  const bool is_list = change.kind == Kind::kPlaylist || change.kind == Kind::kCueSheet;
  const bool is_settled = before == (is_list ? stamp_of(change.path) : answer.after) &&
                          std::abs(now() - out.status.modified) > kTick;
  if (!is_settled) out.status.size = -2;
  return out;
}

bool Scanner::is_in_index(const Change& change) {
  const char* tables[] = {"track WHERE is_virtual = 'FALSE' AND", "photo WHERE", "video WHERE",
                          "playlist WHERE", "playlist WHERE"};
  const auto path = " path = " + literal(change.path);
  auto sql = std::string("SELECT EXISTS (SELECT 1 FROM ") +
             tables[static_cast<std::size_t>(change.kind)] + path + ")";
  if (table_of(change.kind) == MEDIA_TABLE_PLAYLIST) {
    sql += " OR EXISTS (SELECT 1 FROM personal_playlist WHERE" + path + ")";
  }
  auto rows = database_.query(sql + " AS found");
  return rows.next() && rows.flag("found");
}

void Scanner::count_saved(const Ready& ready) {
  if (ready.answer.outcome != TagAnswer::Outcome::kRead) {
    fail(ready.change.path, ready.answer.reason);
    return;
  }
  if (is_settling_) return;
  ++report_.saved[static_cast<std::size_t>(ready.change.kind)];
  switch (ready.change.what) {
    case What::kNew:
      ++report_.added;
      break;
    case What::kMoved:
      ++report_.moved;
      break;
    case What::kChanged:
      ++report_.changed;
      break;
    default:
      break;
  }
}

void Scanner::fail(const std::string& path, const std::string& reason) {
  ++report_.failed;
  hooks_.fail({path, reason, false});
}

std::string Scanner::fail_in_database(const Change& change) {
  auto reason = database_.last_error();
  check_connection();
  const bool is_cue_sheet = !change.is_folder && change.kind == Kind::kCueSheet;
  if (reason.empty()) {
    reason = is_cue_sheet ? "the cue sheet cannot be understood" : "the index could not be changed";
  } else if (is_cue_sheet) {
    reason = "the sheet's tracks: " + reason;
  }
  fail(change.path, reason);
  return reason;
}

// -- Settling ------------------------------------------------------------------------------------

void Scanner::settle() {
  if (!state_.has_unsettled()) return;
  is_settling_ = true;
  const auto save_all = [this] {
    for (const auto step : {Step::kMedia, Step::kPlaylists, Step::kCueSheets}) save_files(step);
  };
  state_.plan_unmarked_audio();
  save_all();
  // Sheets tie albums together: to save one anew may unsettle another, so that the set grows until
  // it holds all that belong together.
  std::set<std::string> albums;
  for (;;) {
    const auto bad = state_.unsettled_albums();
    const auto known = albums.size();
    albums.insert(bad.begin(), bad.end());
    if (bad.empty() || albums.size() == known) break;
    state_.plan_albums(std::vector<std::string>(albums.begin(), albums.end()));
    if (!can_be_read_again()) return;
    remove_before_saving();
    save_all();
    if (stops()) return;
  }
  state_.settled();
}

/// What is taken out of the index has to come back: with a file that cannot be read now, the album
/// has to wait.
bool Scanner::can_be_read_again() {
  for (const auto step : {Step::kMedia, Step::kCueSheets}) {
    std::int64_t after = 0;
    for (auto page = state_.next(step, after, kPage); !page.empty();
         page = state_.next(step, after, kPage)) {
      after = page.back().id;
      const bool can_all = std::ranges::all_of(
          page, [](const Change& change) { return access(change.path.c_str(), R_OK) == 0; });
      if (!can_all) return false;
    }
  }
  return true;
}

void Scanner::remove_before_saving() {
  for (const auto step : {Step::kMedia, Step::kCueSheets}) {
    apply_step(step, one_by_one([](const Change& change) {
                 return MediaInfoDBDelete(table_of(change.kind), change.path.c_str()) == 0;
               }),
               [](const Change&) {});
  }
}

}  // namespace mediidx::tool
