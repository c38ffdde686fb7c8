# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
"""Those who take part: mediidx, MPD and MiniDLNA, and two that do only a part of the work.

Each media server works in a folder of its own below `work`, and answers to the same calls:
    first_index()  from nothing; the cost
    rescan()       the cost; a server that is always there is started before
    holds()        how many audio files it knows
    knows(title)   whether it knows a song of this title
    stop()         before another one works
"""

import os
import shutil
import socket
import sqlite3
import subprocess
import threading
import time

import processes

AUDIO = (".mp3", ".flac", ".m4a", ".ogg")
LIMIT = 1800  # Seconds until a scan counts as hanging.
POLL = 0.002


def fresh(folder):
    shutil.rmtree(folder, ignore_errors=True)
    folder.mkdir(parents=True)
    return folder


def launch(words, output):
    """Starts a server; `output` gets what it says."""
    with output.open("w") as file:
        return subprocess.Popen(words, stdin=subprocess.DEVNULL, stdout=file, stderr=file)


class FullSpeed(threading.Thread):
    """MPD and MiniDLNA scan at a low priority, and have no setting against it.

    While this runs, every thread of `pid` and below has the priority that we have. Only root may
    give it; on a machine that has nothing else to do it makes no difference.
    """

    INTERVAL = 0.01

    def __init__(self, pid):
        super().__init__(daemon=True)
        self.pid = pid
        self.done = threading.Event()

    def run(self):
        usual = os.getpriority(os.PRIO_PROCESS, 0)
        while os.geteuid() == 0 and not self.done.wait(self.INTERVAL):
            for process in processes.descendants(self.pid):
                try:
                    for task in (processes.PROC / str(process) / "task").iterdir():
                        hasten(int(task.name), usual)
                except (FileNotFoundError, ProcessLookupError):
                    pass  # It has ended.

    def __enter__(self):
        self.start()

    def __exit__(self, *_):
        self.done.set()
        self.join()


def hasten(thread, usual):
    if os.sched_getscheduler(thread) == os.SCHED_IDLE:
        os.sched_setscheduler(thread, os.SCHED_OTHER, os.sched_param(0))
    if os.getpriority(os.PRIO_PROCESS, thread) > usual:
        os.setpriority(os.PRIO_PROCESS, thread, usual)


class Deadline:
    def __init__(self, what):
        self.end = time.monotonic() + LIMIT
        self.what = what

    def wait(self):
        if time.monotonic() > self.end:
            raise RuntimeError(f"{self.what} did not end")
        time.sleep(POLL)


class Mediidx:
    """The command, with the private server that it starts and stops each time."""

    name = "mediidx"

    def __init__(self, command, work, folders):
        self.command = command
        self.data = work / "mediidx"
        self.folders = folders
        self.cluster = None  # What the last first_index took to make its database.

    def run(self, *words, **options):
        return processes.run([self.command, "--data-dir", self.data, *words], **options)

    def first_index(self):
        fresh(self.data)
        self.cluster = self.run("db", "init")[1]
        return self.run("index", "--full-speed", *self.folders)[1]

    def rescan(self):
        return self.run("scan", "--full-speed")[1]

    def sql(self, script):
        return self.run("db", "shell", stdin=None, input="\\set QUIET on\n\\a\n\\t\n" + script)

    def holds(self):
        return int(self.sql("SELECT count(*) FROM music;\n")[0])

    def knows(self, title):
        return self.sql(f"SELECT count(*) FROM track WHERE title = '{title}';\n")[0].strip() == "1"

    def stop(self):
        pass


class Mpd:
    """MPD, reached by a socket in its folder. It runs on after its first index, as at home."""

    name = "MPD"

    def __init__(self, work, folders):
        self.music = folders[0]
        self.work = work / "mpd"
        self.process = None
        self.connection = None

    def first_index(self):
        self.stop()
        fresh(self.work)
        (self.work / "mpd.conf").write_text(f"""
music_directory "{self.music}"
db_file "{self.work}/database"
state_file "{self.work}/state"
bind_to_address "{self.work}/socket"
audio_output {{
  type "null"
  name "none"
}}
""")
        watch = processes.Watch(self.cpu)
        self.start()
        self.wait_until_updated()  # Without a database, its start is the first update.
        return watch.cost()

    def cpu(self):
        return processes.cpu_of_tree(self.process.pid) if self.process else 0

    def start(self):
        self.process = launch(["mpd", "--no-daemon", self.work / "mpd.conf"], self.work / "output")
        self.connect()

    def connect(self):
        deadline = Deadline("the start of MPD")
        while True:
            try:
                connection = socket.socket(socket.AF_UNIX)
                connection.connect(str(self.work / "socket"))
                break
            except (FileNotFoundError, ConnectionRefusedError):
                connection.close()
                if self.process.poll() is not None:
                    raise RuntimeError("MPD ended: " + (self.work / "output").read_text())
                deadline.wait()
        self.connection = connection.makefile("rw", encoding="utf-8", newline="\n")
        self.connection.readline()

    def ask(self, command):
        self.connection.write(command + "\n")
        self.connection.flush()
        lines = []
        while (line := self.connection.readline().rstrip("\n")) != "OK":
            if not line or line.startswith("ACK"):
                raise RuntimeError(f"MPD: {command}: {line}")
            lines.append(line)
        return lines

    def wait_until_updated(self):
        """It writes its database before it says that the update is done."""
        with FullSpeed(self.process.pid):
            while any(line.startswith("updating_db:") for line in self.ask("status")):
                self.ask("idle update")

    def rescan(self):
        if not self.process:
            self.start()
        watch = processes.Watch(self.cpu)
        self.ask("update")
        self.wait_until_updated()
        return watch.cost()

    def holds(self):
        """A cue sheet stands as a folder of tracks in the place of its one audio file."""
        lines = self.ask("listall")
        return (sum(line.startswith("file: ") and line.endswith(AUDIO) for line in lines) +
                sum(line.startswith("directory: ") and line.endswith(".cue") for line in lines))

    def knows(self, title):
        return f"Title: {title}" in self.ask(f'find "(Title == \\"{title}\\")"')

    def stop(self):
        if self.connection:
            self.connection.close()
            self.connection = None
        if self.process:
            self.process.terminate()
            self.process.wait()
            self.process = None


class MiniDlna:
    """MiniDLNA, in a network of its own: it has no setting that keeps it from listening to others.

    Its scan is a process that it starts, and that has ended when the scan has.
    """

    name = "MiniDLNA"
    ALONE = ["unshare", "--net", *([] if os.geteuid() == 0 else ["--map-root-user"])]

    @classmethod
    def may_run(cls):
        """Not in every container."""
        return subprocess.run([*cls.ALONE, "true"], check=False,
                              stderr=subprocess.DEVNULL).returncode == 0

    def __init__(self, work, folders):
        self.work = work / "minidlna"
        self.folders = folders
        self.process = None

    def start(self, option):
        self.stop()
        watch = processes.Watch(self.cpu)
        self.process = launch([*self.ALONE, "minidlnad", "-S", option, "-f",
                               self.work / "minidlna.conf", "-P", self.work / "pid"],
                              self.work / "output")
        self.wait_for_scan()
        return watch.cost()

    def cpu(self):
        return processes.cpu_of_tree(self.process.pid) if self.process else 0

    def wait_for_scan(self):
        deadline = Deadline("the scan of MiniDLNA")
        with FullSpeed(self.process.pid):
            while ("Finished parsing playlists" not in self.log() or
                   processes.children(self.process.pid)):
                if self.process.poll() is not None:
                    raise RuntimeError("MiniDLNA ended: " + (self.work / "output").read_text())
                deadline.wait()

    def log(self):
        log = self.work / "log" / "minidlna.log"
        return log.read_text() if log.exists() else ""

    def first_index(self):
        self.stop()
        fresh(self.work)
        (self.work / "log").mkdir()
        lines = [f"media_dir={folder}" for folder in self.folders]
        (self.work / "minidlna.conf").write_text("\n".join(lines) + f"""
db_dir={self.work}/database
log_dir={self.work}/log
port=8200
inotify=no
""")
        return self.start("-R")

    def rescan(self):
        self.stop()
        (self.work / "log" / "minidlna.log").unlink()
        return self.start("-r")

    def ask(self, query, *values):
        database = sqlite3.connect(f"file:{self.work}/database/files.db?mode=ro", uri=True)
        try:
            return database.execute(query, values).fetchone()[0]
        finally:
            database.close()

    def holds(self):
        return self.ask("SELECT count(*) FROM DETAILS WHERE MIME LIKE 'audio/%' "
                        "AND PATH IS NOT NULL")

    def knows(self, title):
        return self.ask("SELECT count(*) FROM DETAILS WHERE TITLE = ?", title) == 1

    def stop(self):
        if self.process:
            self.process.terminate()
            self.process.wait()
            self.process = None


class TagLib:
    """Reads the tags of every file on one core, and does nothing with them."""

    name = "TagLib"

    def __init__(self, program, music):
        self.words = [program, music]

    def run(self):
        return processes.run(self.words)[1]


class Copy:
    """PostgreSQL takes the six rows of each song by COPY, a hundred songs a transaction.

    Rows, tables, server and its settings are those of mediidx.
    """

    name = "COPY"
    SONGS = 100
    TABLES = {"music": "id", "track": "id", "genre_track": "track", "composer_track": "track",
              "artist_track": "track", "album_track": "track"}

    def __init__(self, source, work):
        """`source` is a Mediidx that has indexed."""
        self.target = Mediidx(source.command, work / "copy", [])
        self.script = work / "copy.sql"
        fresh(self.target.data)
        rows = {}
        for table, key in self.TABLES.items():
            songs = ("" if table == "music" else
                     f"WHERE {key} IN (SELECT id FROM track WHERE is_virtual = 'FALSE')")
            output = source.sql(f"COPY (SELECT * FROM {table} {songs} ORDER BY {key}) TO STDOUT;\n")
            rows[table] = output[0].split("\n")[:-1]
        self.songs = len(rows["music"])
        if any(len(lines) != self.songs for lines in rows.values()):
            raise RuntimeError("a song of the corpus has more than six rows")
        self.target.run("db", "init")
        now = "SELECT extract(epoch FROM clock_timestamp())"
        with self.script.open("w") as script:
            script.write(f"TRUNCATE {', '.join(self.TABLES)} CASCADE;\n{now} AS begin \\gset\n")
            for first in range(0, self.songs, self.SONGS):
                script.write("BEGIN;\n")
                for table, lines in rows.items():
                    script.write(f"COPY {table} FROM STDIN;\n")
                    script.write("\n".join([*lines[first:first + self.SONGS], "\\.\n"]))
                script.write("COMMIT;\n")
            script.write(f"{now} - :begin;\n")

    def run(self):
        """The seconds are those between the first row and the last."""
        output, cost = self.target.sql(f"\\i {self.script}\n")
        cost.seconds = float(output)
        return cost
