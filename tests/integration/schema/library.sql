-- SPDX-FileCopyrightText: The mediidx developers
-- SPDX-License-Identifier: MIT
--
-- Fills the tables with a library of 100,000 songs, half of them with CJK names, for the checks of
-- plans. Its files lie in the shares sounds, films, pictures and homes of /volume3, which no other
-- test uses: what a test looked for is what few rows or none have.

SET synchronous_commit = off;

-- One row per album of 11 songs: its folder, and how its album artist came about.
CREATE TEMPORARY TABLE plan AS
SELECT a,
       CASE WHEN a % 2 = 0 THEN '日本の音楽 第' || a || '集' ELSE 'Collected Works ' || a END AS album,
       CASE WHEN a % 2 = 0 THEN '歌手' || a % 1500 ELSE 'Artist ' || a % 1500 END AS artist,
       CASE WHEN a % 10 = 0 THEN 1001 + a % 30 ELSE 0 END AS userid,
       a % 20 = 3 AS collapsed,
       a % 4 = 1 AS tagged,
       CASE WHEN a % 10 = 0 THEN '/volume3/homes/user' || a % 30 || '/music/'
            ELSE '/volume3/sounds/' || a % 300 || '/' END
       || CASE WHEN a % 2 = 0 THEN '日本の音楽 第' || a || '集' ELSE 'Collected Works ' || a END
       || CASE WHEN a % 400 = 1 THEN long.tail ELSE '' END AS folder
FROM generate_series(1, 9100) AS a,
     (SELECT string_agg('/' || md5(n::text) || repeat('長い', 30), '') AS tail
      FROM generate_series(1, 14) AS n) AS long;

INSERT INTO track(userid, path, title, title_sort, title_search, agg_genre, agg_genre_sort,
                  agg_genre_search, filesize, year, frequency, channel, bitrate, duration, comment,
                  track, disc, container, codec, is_virtual, has_virtual, covercount, date, mdate)
SELECT userid,
       folder || '/' || lpad(t::text, 2, '0')
       || CASE WHEN a % 2 = 0 THEN ' 夜の歌.mp3' ELSE ' Night Song.mp3' END,
       'Song ' || t, 'SONG', 'SONG', 'Rock', 'ROCK', 'ROCK', 4000000 + a, 1970 + a % 50, 44100, 2,
       320000, '215.000000', '', t, 1, 'mp3', 'mp3', 'FALSE', 'FALSE', 1, 'epoch', 'epoch'
FROM plan, generate_series(1, 11) AS t;

-- Cue sheets: 500 albums in one file, cut into 12 tracks.
INSERT INTO track(userid, path, title, title_sort, title_search, agg_genre, agg_genre_sort,
                  agg_genre_search, year, duration, comment, is_virtual, has_virtual, track, date)
SELECT userid, folder || '/01 Night Song.mp3', 'Part ' || t, 'PART', 'PART', 'Jazz', 'JAZZ',
       'JAZZ', 1980, '180.000000', '00:0' || t % 10 || ':00' || left(folder, 200) || '/album.cue',
       'TRUE', 'FALSE', t, 'epoch'
FROM plan, generate_series(1, 12) AS t
WHERE a % 18 = 1;

INSERT INTO virtual_info_track(track, audio_offset, cue_sheet_path)
SELECT id, '00:00:00', regexp_replace(path, '/[^/]*$', '/album.cue') FROM track
WHERE is_virtual = 'TRUE';
INSERT INTO virtual_music(path, title, album, artist, album_artist, composer, year, genre, comment,
                          duration, track)
SELECT path, title, '', '', '', '', year, 'Jazz', comment, 180, track FROM track
WHERE is_virtual = 'TRUE' AND userid = 0;

-- The album of each track is known by its folder; one song in a hundred has no album tag.
CREATE TEMPORARY TABLE song AS
SELECT id, album, artist, collapsed, tagged, id % 100 = 0 AS untagged
FROM track JOIN plan ON regexp_replace(path, '/[^/]*$', '') = folder;

INSERT INTO genre_track SELECT id, 'Rock', 'ROCK', 'ROCK' FROM song;
INSERT INTO composer_track SELECT id, artist, artist, artist FROM song;
INSERT INTO artist_track
SELECT id, artist, upper(artist), upper(artist), CASE WHEN tagged THEN 'TRUE' ELSE 'FALSE' END
FROM song;
INSERT INTO album_track
SELECT id, CASE WHEN untagged THEN '' ELSE album END, upper(album), upper(album),
       CASE WHEN collapsed OR untagged THEN '' ELSE artist END, '', '',
       CASE WHEN collapsed OR untagged OR tagged THEN 'TRUE' ELSE 'FALSE' END
FROM song;
INSERT INTO rating_track SELECT 1001, id, 4 FROM song WHERE id % 10 = 0;
INSERT INTO replaygain_track
SELECT id, '-6.500000', '0.988000', '-7.000000', '1.000000' FROM song WHERE id % 2 = 0;

INSERT INTO music(path, filesize, title, album, artist, album_artist, composer, comment, year, genre,
                  channel, frequency, bitrate, duration, track, disc, covercount, date, mdate, fs_uuid,
                  fs_online)
SELECT path, filesize, title, 'Collected Works', 'Artist', '', '', comment, year, agg_genre, channel,
       frequency, bitrate, 215, track, disc, covercount, date, mdate, 'volume3', id % 503 <> 0
FROM track WHERE userid = 0 AND is_virtual = 'FALSE';

INSERT INTO directory(path, title, date, mdate, fs_uuid, fs_online)
SELECT folder || part, album, 'epoch', 'epoch', 'volume3', a % 500 <> 1
FROM plan, unnest(ARRAY['', '/covers', '/disc 1', '/歌詞']) AS part WHERE userid = 0;
INSERT INTO personal_directory(userid, path, title, date, mdate, fs_uuid, updated)
SELECT userid, folder || part, album, 'epoch', 'epoch', 'volume3', 1
FROM plan, unnest(ARRAY['', '/covers', '/disc 1', '/disc 2', '/extras']) AS part WHERE userid <> 0;
INSERT INTO playlist(path, filesize, title, album, song_count, date, mdate, fs_uuid, fs_online)
SELECT folder || '/' || name, 900, album, '', 12, 'epoch', 'epoch', 'volume3', a % 500 <> 1
FROM plan, unnest(ARRAY['album.cue', 'list.m3u', 'お気に入り.m3u', 'all.pls']) AS name WHERE userid = 0;
INSERT INTO personal_playlist(userid, path, filesize, title, album, song_count, date, mdate, fs_uuid,
                              updated)
SELECT userid, folder || '/' || p || '.m3u', 900, album, '', 12, 'epoch', 'epoch', 'volume3', 1
FROM plan, generate_series(1, 5) AS p WHERE userid <> 0;

INSERT INTO video(path, filesize, title, album, duration, date, mdate, fs_uuid, fs_online)
SELECT '/volume3/films/' || v % 100
       || CASE WHEN v % 2 = 0 THEN '/夏の映画 ' ELSE '/Summer Film ' END || v
       || CASE WHEN v % 200 = 1 THEN repeat('/とても長い道', 150) || '/' || v ELSE '' END || '.mkv',
       700000000, 'Film', '', 5400, 'epoch', 'epoch', 'volume3', v % 500 <> 0
FROM generate_series(1, 30000) AS v;
INSERT INTO video_convert(video_path, convert_file_path, resolutionx, resolutiony)
SELECT path, path || '.mp4', 640, 480 FROM video WHERE id % 2 = 0;
INSERT INTO photo(path, filesize, title, album, date, mdate, timetaken, fs_uuid, fs_online)
SELECT '/volume3/pictures/' || p % 500
       || CASE WHEN p % 2 = 0 THEN '/写真_' ELSE '/IMG_' END || p
       || CASE WHEN p % 1000 = 1 THEN repeat('/とても長い道', 150) || '/' || p ELSE '' END || '.jpg',
       3000000, 'Photo', '', 'epoch', 'epoch', 'epoch', 'volume3', p % 500 <> 0
FROM generate_series(1, 60000) AS p;

DROP TABLE plan, song;
