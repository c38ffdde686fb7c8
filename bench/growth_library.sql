-- SPDX-FileCopyrightText: The mediidx developers
-- SPDX-License-Identifier: MIT
--
-- Adds the albums bench.first to bench.last, of 10 songs each, to a library of bench.last albums: one in
-- four has its album artist in its tags, one in twenty several artists and none. Names do not repeat
-- more often in a larger library.

SET synchronous_commit = off;

CREATE TEMPORARY TABLE plan AS
SELECT a, 'Collected Works ' || a AS album, 'Artist ' || a / 6 AS artist,
       a % 20 = 3 AS several, a % 4 = 1 AS tagged,
       '/volume3/sounds/' || a / 30 || '/Collected Works ' || a AS folder
FROM generate_series(current_setting('bench.first')::int, current_setting('bench.last')::int) AS a;
CREATE TEMPORARY TABLE file AS
SELECT plan.*, number, folder || '/' || lpad(number::text, 2, '0') || ' Song of '
       || substr(md5(a || ' ' || number), 1, 9) || '.mp3' AS path
FROM plan, generate_series(1, 10) AS number;

INSERT INTO track(userid, path, title, title_sort, title_search, agg_genre, agg_genre_sort,
                  agg_genre_search, filesize, year, frequency, channel, bitrate, duration, comment,
                  track, disc, container, codec, is_virtual, has_virtual, covercount, date, mdate)
SELECT 0, path, 'Song ' || number, 'SONG ' || number, 'SONG ' || number, 'Rock', 'ROCK', 'ROCK',
       4000000 + a, 1970 + a % 50, 44100, 2, 320000, '215.000000', '', number, 1, 'mp3', 'mp3',
       'FALSE', 'FALSE', 1, 'epoch', 'epoch'
FROM file;

ANALYZE file, track;
CREATE TEMPORARY TABLE song AS SELECT t.id, file.* FROM file JOIN track t ON t.path = file.path;

INSERT INTO genre_track SELECT id, 'Rock', 'ROCK', 'ROCK' FROM song;
INSERT INTO composer_track SELECT id, artist, upper(artist), upper(artist) FROM song;
INSERT INTO artist_track
SELECT id, artist || suffix, upper(artist || suffix), upper(artist || suffix),
       CASE WHEN tagged THEN 'TRUE' ELSE 'FALSE' END
FROM (SELECT *, CASE WHEN several THEN ' ' || number ELSE '' END AS suffix FROM song) s;
INSERT INTO album_track
SELECT id, album, upper(album), upper(album), CASE WHEN several THEN '' ELSE artist END,
       CASE WHEN several THEN '' ELSE upper(artist) END,
       CASE WHEN several THEN '' ELSE upper(artist) END,
       CASE WHEN several OR tagged THEN 'TRUE' ELSE 'FALSE' END
FROM song;
INSERT INTO music(path, filesize, title, album, artist, album_artist, composer, comment, year, genre,
                  channel, frequency, bitrate, duration, track, disc, covercount, date, mdate, fs_uuid,
                  fs_online)
SELECT path, 4000000 + a, 'Song ' || number, album, artist, '', artist, '', 1970 + a % 50, 'Rock', 2,
       44100, 320000, 215, number, 1, 1, 'epoch', 'epoch', 'volume3', true
FROM song;
INSERT INTO directory(path, title, date, mdate, fs_uuid, fs_online)
SELECT folder, album, 'epoch', 'epoch', 'volume3', true FROM plan;

DROP TABLE plan, file, song;
