// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include "media_tree.h"

#include <fcntl.h>
#include <fileref.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <tpropertymap.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <fstream>
#include <stdexcept>

namespace mediidx::test {
namespace {

namespace fs = std::filesystem;

constexpr const char* kFolderNames[] = {"a", "b", "c d", "é"};
constexpr const char* kFileNames[] = {"1", "2", "3", "it's"};
constexpr std::size_t kDeepest = 3;

struct Sample {
  const char* extension;
  const char* file;
};
constexpr Sample kSongs[] = {{".mp3", "music/Untagged/tape side A.mp3"},
                             {".mp3", "music/Other Scripts/café.mp3"},
                             {".flac", "music/Harbour Lights/Low Tide/01 - Slack Water.flac"},
                             {".ogg", "music/Confluence/02 Weir.ogg"},
                             {".opus", "music/Confluence/03 Lock.opus"},
                             {".m4a", "music/Mina Okafor/Tide Tables/02 Low Water.m4a"},
                             {".wav", "music/Untagged/tape side B.wav"}};
constexpr Sample kViews[] = {{".jpg", "photos/2021 Harbour/IMG_0001.jpg"},
                             {".jpg", "photos/2021 Harbour/IMG_0002.jpg"},
                             {".png", "photos/旅行/東京.png"},
                             {".mp4", "videos/harbour.mp4"},
                             {".mkv", "videos/Ferry Tales/S01E01 - Cast Off.mkv"}};
/// One sheet a folder under one name, about files beside it: two sheets that cut one file under one
/// number share what hangs on the track.
constexpr const char* kSheet = "sheet.cue";

constexpr const char* kAlbums[] = {"", "", "Low Tide", "Confluence", "The Quay"};
constexpr const char* kArtists[] = {"", "Ada Brandt", "Bo Lindqvist", "The Ferrymen"};
constexpr const char* kAlbumArtists[] = {"", "", "", "Ada Brandt", "Harbour Lights"};
constexpr const char* kGenres[] = {"", "Jazz", "Folk;Jazz", "Live"};
constexpr const char* kTitles[] = {"", "Slack Water", "A Long Ebb", "Weir"};

/// In every root: one that is empty is taken for one that is away.
constexpr const char* kGuard = "read me.txt";

void write_file(const std::string& file, const std::string& text) {
  std::ofstream out(file, std::ios::binary | std::ios::trunc);
  out << text;
  out.close();
  if (!out) throw std::runtime_error("cannot write " + file);
}

bool is_song(const std::string& file) {
  return std::ranges::any_of(kSongs,
                             [&](const auto& song) { return file.ends_with(song.extension); });
}

bool is_sheet(const std::string& file) { return fs::path(file).filename() == kSheet; }

/// The folder that keeps what users said about a file.
std::string attributes_of(const std::string& file) {
  const fs::path path = file;
  return path.parent_path() / "@eaDir" / path.filename();
}

void mount_or_throw(const char* source, const std::string& target, const char* type,
                    unsigned long flags) {
  if (mount(source, target.c_str(), type, flags, nullptr) != 0) {
    throw std::runtime_error("cannot mount " + target + ": " + std::strerror(errno));
  }
}

}  // namespace

MediaTree::MediaTree(fs::path base, Dice& dice) : base_(std::move(base)), dice_(dice) {
  // The second one's name begins with the whole of the first one's.
  for (const char* name : {"disk1", "disk10", "homes/ann/music"}) {
    roots_.push_back(base_ / name);
    fs::create_directories(roots_.back());
  }
  fs::create_directories(base_ / "disks");
  // Other processes of this machine shall not see the mounts, nor keep them.
  static const bool may_mount =
      unshare(CLONE_NEWNS) == 0 && mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0;
  if (may_mount) mount_second_root();
  for (const auto& root : roots_) write_file(root + "/" + kGuard, "stays");
}

void MediaTree::mount_second_root() {
  mount_ = roots_[1];
  const auto disk = disk_of(mount_);
  fs::create_directories(disk);
  mount_or_throw("mediidx-test", disk, "tmpfs", 0);
  fs::permissions(disk, fs::perms(0755));
  mount_or_throw(disk.c_str(), mount_, nullptr, MS_BIND);
}

MediaTree::~MediaTree() {
  for (const auto& path : closed_) chmod(path.c_str(), 0755);
  if (mount_.empty()) return;
  if (!away_.contains(mount_)) umount2(mount_.c_str(), MNT_DETACH);
  umount2(disk_of(mount_).c_str(), MNT_DETACH);
}

std::string MediaTree::disk_of(const std::string& root) const {
  return base_ / "disks" / fs::path(root).filename();
}

bool MediaTree::is_closed(const std::string& path) const {
  return std::ranges::any_of(closed_, [&](const std::string& closed) {
    return path == closed || path.starts_with(closed + "/");
  });
}

bool MediaTree::may_be_ignored(const std::string& path) const {
  for (fs::path folder = path; folder != base_; folder = folder.parent_path()) {
    if (fs::exists(folder.parent_path() / ".mediidxignore")) return true;
  }
  return false;
}

bool MediaTree::holds_closed(const std::string& folder) const {
  return std::ranges::any_of(
      closed_, [&](const std::string& closed) { return closed.starts_with(folder + "/"); });
}

MediaTree::Listing MediaTree::list() const {
  Listing found;
  for (const auto& root : roots_) {
    if (is_away(root) || is_closed(root)) continue;
    found.folders.push_back(root);
    for (auto entry = fs::recursive_directory_iterator(root); entry != fs::end(entry); ++entry) {
      const auto name = entry->path().filename().string();
      const bool is_folder = entry->is_directory();
      if (name.starts_with('.') || name == "@eaDir" || name == kGuard || is_closed(entry->path())) {
        if (is_folder) entry.disable_recursion_pending();
      } else {
        (is_folder ? found.folders : found.files).push_back(entry->path());
      }
    }
  }
  std::ranges::sort(found.folders);
  std::ranges::sort(found.files);
  return found;
}

std::string MediaTree::any_folder() {
  const auto folders = list().folders;
  return folders.empty() ? "" : dice_.one_of(folders);
}

std::string MediaTree::any_folder_below_roots() {
  auto folders = list().folders;
  std::erase_if(folders, [&](const auto& folder) {
    return std::ranges::find(roots_, folder) != roots_.end();
  });
  return folders.empty() ? "" : dice_.one_of(folders);
}

std::string MediaTree::any_file() {
  const auto files = list().files;
  return files.empty() ? "" : dice_.one_of(files);
}

std::string MediaTree::new_file(const std::vector<std::string>& extensions) {
  const auto folder = any_folder();
  if (folder.empty()) return "";
  const auto file = folder + "/" + dice_.one_of(kFileNames) + dice_.one_of(extensions);
  return is_closed(file) ? "" : file;
}

void MediaTree::put_sample(const std::string& sample, const std::string& file) {
  fs::remove(file);
  fs::copy_file(fs::path(MEDIIDX_SAMPLE_LIBRARY) / sample, file);
}

void MediaTree::set_random_tags(const std::string& file) {
  TagLib::PropertyMap tags;
  const auto set = [&tags](const char* name, const std::string& value) {
    if (!value.empty()) {
      tags.replace(name, TagLib::StringList(TagLib::String(value, TagLib::String::UTF8)));
    }
  };
  if (dice_.chance(85)) {
    set("TITLE", dice_.one_of(kTitles));
    set("ALBUM", dice_.one_of(kAlbums));
    set("ARTIST", dice_.one_of(kArtists));
    set("ALBUMARTIST", dice_.one_of(kAlbumArtists));
    set("GENRE", dice_.one_of(kGenres));
    set("COMPOSER", dice_.one_of(kArtists));
    set("TRACKNUMBER", std::to_string(dice_.below(4)));
    set("DATE", std::to_string(2000 + dice_.below(3)));
    if (dice_.chance(30)) {
      set("REPLAYGAIN_TRACK_GAIN", "-" + std::to_string(dice_.below(9)) + ".50 dB");
      set("REPLAYGAIN_TRACK_PEAK", "0.9");
    }
  }
  TagLib::FileRef song(file.c_str());
  if (song.isNull()) throw std::runtime_error("no song: " + file);
  song.file()->setProperties(tags);
  if (!song.save()) throw std::runtime_error("cannot tag " + file);
}

std::string MediaTree::add_audio() {
  const auto& song = dice_.one_of(kSongs);
  const auto file = new_file({song.extension});
  if (file.empty()) return "";
  put_sample(song.file, file);
  set_random_tags(file);
  std::string rated;
  if (dice_.chance(25)) {
    rated = ", rated";
    fs::create_directories(attributes_of(file));
    write_file(attributes_of(file) + "/TAVOAUDIO_SONG_RATING",
               "1026=" + std::to_string(dice_.below(6)) + "\n");
  }
  return "add " + file + rated;
}

std::string MediaTree::add_picture_or_film() {
  const auto& view = dice_.one_of(kViews);
  const auto file = new_file({view.extension});
  if (file.empty()) return "";
  put_sample(view.file, file);
  return "add " + file;
}

std::string MediaTree::add_playlist() {
  const auto file = new_file({".m3u"});
  if (file.empty()) return "";
  std::string text;
  for (int i = 0; i < 3; ++i) {
    const auto song = any_file();
    if (is_song(song))
      text += fs::path(song).lexically_relative(fs::path(file).parent_path()).string() + "\n";
  }
  write_file(file, text + "not there.mp3\n");
  return "add " + file;
}

std::string MediaTree::add_cue_sheet() {
  fs::path song = any_file();
  if (!is_song(song)) return "";
  const auto folder = song.parent_path().string();
  if (is_closed(folder + "/" + kSheet)) return "";
  if (dice_.chance(20)) song.replace_filename(std::string(dice_.one_of(kFileNames)) + ".mp3");
  std::string text = "PERFORMER \"" + std::string(dice_.one_of(kArtists)) + "\"\nTITLE \"" +
                     dice_.one_of(kAlbums) + "\"\nFILE \"" + song.filename().string() + "\" WAVE\n";
  const auto tracks = 1 + dice_.below(3);
  for (std::size_t i = 1; i <= tracks; ++i) {
    text += "  TRACK 0" + std::to_string(i) + " AUDIO\n    TITLE \"Part " + std::to_string(i) +
            "\"\n    PERFORMER \"" + dice_.one_of(kArtists) +
            "\"\n    INDEX 01 00:00:" + std::to_string(10 + 20 * i) + "\n";
  }
  write_file(folder + "/" + kSheet, text);
  return "add " + folder + "/" + kSheet + " of " + song.filename().string();
}

std::string MediaTree::add_folder() {
  const auto above = any_folder();
  if (above.empty()) return "";
  for (const auto& root : roots_) {
    const auto below = fs::path(above).lexically_relative(root);
    const auto depth = static_cast<std::size_t>(std::distance(below.begin(), below.end()));
    if (above.starts_with(root + "/") && depth >= kDeepest) return "";
  }
  const auto folder = above + "/" + dice_.one_of(kFolderNames);
  return fs::create_directory(folder) ? "make " + folder : "";
}

std::string MediaTree::add_damaged() {
  const auto old = any_file();
  const auto file = is_song(old) ? old : new_file({".mp3", ".jpg", ".mkv"});
  if (file.empty()) return "";
  write_file(file, std::string(300 + dice_.below(300), 'x'));
  return "damage " + file;
}

std::string MediaTree::retag() {
  const auto file = any_file();
  if (!is_song(file)) return "";
  const TagLib::FileRef song(file.c_str());
  if (song.isNull() || !song.file()->isValid() || !song.tag()) return "";
  set_random_tags(file);
  return "retag " + file;
}

/// As most programs write: a new file is given the old one's name.
std::string MediaTree::replace() {
  const auto file = any_file();
  for (const auto& samples : {std::vector<Sample>(std::begin(kSongs), std::end(kSongs)),
                              std::vector<Sample>(std::begin(kViews), std::end(kViews))}) {
    for (const auto& [extension, sample] : samples) {
      if (!file.ends_with(extension)) continue;
      const auto hidden =
          (fs::path(file).parent_path() / (std::string(".new") + extension)).string();
      put_sample(sample, hidden);
      if (is_song(file)) set_random_tags(hidden);
      fs::rename(hidden, file);
      return "replace " + file;
    }
  }
  return "";
}

std::string MediaTree::touch() {
  const auto file = any_file();
  if (file.empty()) return "";
  const auto now = time(nullptr);
  const auto step = static_cast<time_t>(dice_.below(2'000'000)) - 1'000'000;
  const timespec times[2] = {{now, 0}, {now + step, 0}};
  utimensat(AT_FDCWD, file.c_str(), times, 0);
  return "touch " + file + " " + std::to_string(step) + " s";
}

std::string MediaTree::empty_out() {
  const auto file = any_file();
  if (file.empty()) return "";
  write_file(file, "");
  return "empty " + file;
}

/// False across file systems, where nothing is done.
bool MediaTree::rename(const std::string& from, const std::string& to) {
  std::error_code error;
  fs::rename(from, to, error);
  return !error;
}

std::string MediaTree::move_file() {
  const auto from = any_file();
  const auto folder = any_folder();
  if (from.empty()) return "";
  const auto name = is_sheet(from) || dice_.chance(40)
                        ? fs::path(from).filename().string()
                        : dice_.one_of(kFileNames) + fs::path(from).extension().string();
  const auto to = folder + "/" + name;
  if (to == from || is_closed(to) || fs::is_directory(to)) return "";
  return rename(from, to) ? "move " + from + " to " + to : "";
}

std::string MediaTree::move_folder() {
  const auto from = any_folder_below_roots();
  const auto above = any_folder();
  if (from.empty() || holds_closed(from) || above == from || above.starts_with(from + "/"))
    return "";
  const auto to = above + "/" + dice_.one_of(kFolderNames);
  if (fs::exists(to) || is_closed(to)) return "";
  return rename(from, to) ? "move " + from + "/ to " + to + "/" : "";
}

std::string MediaTree::swap_files() {
  const auto one = any_file();
  const auto two = any_file();
  if (one == two || fs::path(one).extension() != fs::path(two).extension()) return "";
  const auto aside = (fs::path(one).parent_path() / ".aside").string();
  if (!rename(one, aside)) return "";
  if (!rename(two, one)) {
    rename(aside, one);
    return "";
  }
  rename(aside, two);
  return "swap " + one + " and " + two;
}

std::string MediaTree::swap_folders() {
  const auto one = any_folder_below_roots();
  const auto two = any_folder_below_roots();
  if (one == two || holds_closed(one) || holds_closed(two) || one.starts_with(two + "/") ||
      two.starts_with(one + "/"))
    return "";
  const auto aside = (fs::path(one).parent_path() / ".aside").string();
  if (!rename(one, aside)) return "";
  if (!rename(two, one)) {
    rename(aside, one);
    return "";
  }
  rename(aside, two);
  return "swap " + one + "/ and " + two + "/";
}

std::string MediaTree::remove_file() {
  const auto file = any_file();
  if (file.empty()) return "";
  fs::remove(file);
  return "remove " + file;
}

std::string MediaTree::remove_folder() {
  const auto folder = any_folder_below_roots();
  if (folder.empty() || holds_closed(folder)) return "";
  fs::remove_all(folder);
  return "remove " + folder + "/";
}

std::string MediaTree::ignore_something() {
  constexpr const char* kRules[] = {"", "*.mp3\n", "/1.*\n", "b/\n!b/1.flac\n", "*\n!*/\n!2.*\n"};
  const auto folder = any_folder();
  if (folder.empty()) return "";
  const std::string rules = dice_.one_of(kRules);
  const auto file = folder + "/.mediidxignore";
  if (rules.empty()) {
    fs::remove(file);
  } else {
    write_file(file, rules);
  }
  return "ignore in " + folder + ": " + rules;
}

std::string MediaTree::close_something() {
  const auto path = dice_.chance(60) ? any_folder_below_roots() : any_file();
  if (path.empty() || chmod(path.c_str(), 0) != 0) return "";
  closed_.insert(path);
  return "close " + path;
}

std::string MediaTree::open_all() {
  // Those of roots that are away wait for them.
  std::string what;
  for (auto path = closed_.begin(); path != closed_.end();) {
    std::error_code ignored;
    if (fs::exists(*path, ignored)) {
      fs::permissions(*path, fs::perms(fs::is_directory(*path) ? 0755 : 0644));
      what += "open " + *path + " ";
      path = closed_.erase(path);
    } else {
      ++path;
    }
  }
  return what;
}

std::string MediaTree::take_root_away() {
  const auto& root = dice_.one_of(roots_);
  if (is_away(root)) return "";
  if (root == mount_) {
    if (umount2(root.c_str(), MNT_DETACH) != 0) throw std::runtime_error("cannot unmount " + root);
    away_.insert(root);
    if (!dice_.chance(30)) return "unmount " + root;
    write_file(root + "/stray.txt", "written while the disk was away");
    put_sample(kSongs[0].file, root + "/stray.mp3");
    return "unmount " + root + ", strays in its place";
  }
  if (!rename(root, disk_of(root))) throw std::runtime_error("cannot move " + root);
  away_.insert(root);
  if (!dice_.chance(50)) return "take away " + root;
  fs::create_directory(root);
  return "take away " + root + ", empty in its place";
}

std::string MediaTree::bring_root_back() {
  if (away_.empty()) return "";
  const auto root = *away_.begin();
  if (root == mount_) {
    fs::remove(root + "/stray.txt");
    fs::remove(root + "/stray.mp3");
    mount_or_throw(disk_of(root).c_str(), root, nullptr, MS_BIND);
  } else {
    fs::remove_all(root);
    if (!rename(disk_of(root), root)) throw std::runtime_error("cannot move back " + root);
  }
  away_.erase(root);
  return "bring back " + root;
}

void MediaTree::tell_apart() {
  auto [paths, files] = list();
  paths.insert(paths.end(), files.begin(), files.end());
  std::set<std::pair<time_t, long>> taken;
  for (const auto& path : paths) {
    struct stat status{};
    if (stat(path.c_str(), &status) != 0) continue;
    auto modified = status.st_mtim;
    if (taken.insert({modified.tv_sec, modified.tv_nsec}).second) continue;
    while (!taken.insert({modified.tv_sec, modified.tv_nsec}).second) ++modified.tv_nsec;
    const timespec times[2] = {status.st_atim, modified};
    utimensat(AT_FDCWD, path.c_str(), times, 0);
  }
}

void MediaTree::restore() {
  while (!bring_root_back().empty()) continue;
  open_all();
}

}  // namespace mediidx::test
