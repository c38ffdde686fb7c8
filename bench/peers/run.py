#!/usr/bin/python3
# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
"""run.py BUILD_FOLDER SIZE [REPORT PLOT]: compares mediidx with other media servers.

SIZE audio files are indexed, scanned again, and again when one of them has changed; five times as
many are scanned again. Everybody takes turns, in an order that moves on by one each round. Times
are medians of three rounds. Memory is watched in a round of its own, for that takes time. The
programs bench_* of the build folder are run too. With a SIZE below 1,000 there is one round, without
them. Prints the results; REPORT gets them between two marks, and PLOT a picture of them.
"""

import dataclasses
import json
import os
import pathlib
import statistics
import subprocess
import sys

import processes
import report
import systems
from corpus import Corpus

LARGE = 5
QUICK = 1000  # Fewer files only show that all of this works.


def say(text):
    print(f"bench: {text}", file=sys.stderr, flush=True)


def turns(members, round_number):
    start = round_number % len(members)
    return members[start:] + members[:start]


def median(costs):
    return processes.Cost(*map(statistics.median, zip(*map(dataclasses.astuple, costs))))


def check(holds, system, expected, what):
    if not holds:
        raise RuntimeError(f"{system.name}: {what} is not in its index after a scan ({expected})")


class Results:
    """The costs of each round, by what was done and by whom; memory likewise, of one round."""

    def __init__(self):
        self.costs = {}
        self.memory = {}

    def add(self, work, name, cost):
        self.costs.setdefault((work, name), []).append(cost)

    def cost(self, work, name):
        costs = self.costs.get((work, name))
        return median(costs) if costs else None

    def others(self):
        """The part of the processors that other programs took."""
        costs = [cost for rounds in self.costs.values() for cost in rounds]
        return max(0.0, sum(cost.others for cost in costs) /
                   (sum(cost.seconds for cost in costs) * os.cpu_count()))


def index_and_rescan(system, corpus, results):
    results.add("first", system.name, system.first_index())
    check(system.holds() == corpus.audio_files, system, corpus.audio_files, "every file")
    if system.name == "mediidx":
        results.add("cluster", system.name, system.cluster)
    results.add("rescan", system.name, system.rescan())
    title = corpus.change_one()
    results.add("changed", system.name, system.rescan())
    check(system.knows(title), system, title, "the changed song")
    system.stop()


def watch_memory(system, corpus, results):
    def peak(work, action):
        with processes.MemoryWatch() as watch:
            action()
        results.memory[work, system.name] = watch.peak

    peak("first", system.first_index)
    peak("rescan", system.rescan)
    corpus.change_one()
    peak("changed", system.rescan)
    system.stop()


def compare(servers, parts, corpus, rounds, results):
    for number in range(rounds):
        for member in turns(servers + parts, number):
            say(f"round {number + 1}: {member.name}")
            if member in parts:
                results.add("first", member.name, member.run())
            else:
                index_and_rescan(member, corpus, results)
    for member in servers + parts:
        say(f"memory: {member.name}")
        if member in parts:
            with processes.MemoryWatch() as watch:
                member.run()
            results.memory["first", member.name] = watch.peak
        else:
            watch_memory(member, corpus, results)


def compare_large(servers, corpus, rounds, results):
    for server in servers:
        say(f"{corpus.audio_files} files: {server.name}")
        with processes.MemoryWatch() as watch:
            server.first_index()
        results.memory["large first", server.name] = watch.peak
        check(server.holds() == corpus.audio_files, server, corpus.audio_files, "every file")
        server.stop()
    for number in range(rounds):
        for server in turns(servers, number):
            results.add("large rescan", server.name, server.rescan())
            server.stop()
    for server in servers:
        with processes.MemoryWatch() as watch:
            server.rescan()
        results.memory["large rescan", server.name] = watch.peak
        server.stop()


def compare_everything(servers, rounds, results):
    for number in range(rounds):
        for server in turns(servers, number):
            results.add("everything", server.name, server.first_index())
            server.stop()


def inner_loops(build):
    """What the programs of Google Benchmark found: their name, and their cases."""
    found = []
    for program in sorted((build / "bin").glob("bench_*")):
        if b"libbenchmark" not in program.read_bytes():
            continue  # It has tables of its own.
        say(program.name)
        output = build / f"{program.name}.json"
        processes.run([program, f"--benchmark_out={output}", "--benchmark_out_format=json"])
        found.append((program.name, json.loads(output.read_text())["benchmarks"]))
    return found


def everybody(command, work, folders):
    servers = [systems.Mediidx(command, work, folders), systems.Mpd(work, folders)]
    if systems.MiniDlna.may_run():
        servers.append(systems.MiniDlna(work, folders))
    return servers


def main():
    build = pathlib.Path(sys.argv[1]).resolve()
    size = int(sys.argv[2])
    program = build / "bin" / "media_corpus"
    processes.become_subreaper()
    # The server of root runs as another user, who has to come this far.
    work = systems.fresh(build / "peers")
    rounds = 1 if size < QUICK else 3
    loops = inner_loops(build) if size >= QUICK else []
    say("the corpus")
    corpus = Corpus(program, build, size)
    large = Corpus(program, build, LARGE * size)
    corpus.warm()
    large.warm()

    command = build / "bin" / "mediidx"
    everything = [corpus.music, corpus.photos, corpus.videos]
    results = Results()
    servers = everybody(command, work, [corpus.music])
    if len(servers) < 3:
        say("without MiniDLNA: there is no right to give it a network of its own")
    of_everything = [server for server in everybody(command, work, everything)
                     if server.name != "MPD"]
    of_large = everybody(command, work, [large.music])
    try:
        say("the rows of COPY")
        servers[0].first_index()
        parts = [systems.TagLib(build / "bin" / "tag_reader", corpus.music),
                 systems.Copy(servers[0], work)]
        compare(servers, parts, corpus, rounds, results)
        compare_everything(of_everything, rounds, results)
        compare_large(of_large, large, rounds, results)
    finally:
        for server in servers + of_everything + of_large:
            server.stop()
        corpus.restore()

    text = report.markdown(results, corpus, large, loops)
    print(text)
    if len(sys.argv) > 3:
        report.publish(text, results, pathlib.Path(sys.argv[3]), pathlib.Path(sys.argv[4]))


if __name__ == "__main__":
    try:
        main()
    except (OSError, RuntimeError, subprocess.CalledProcessError) as error:
        sys.exit(f"bench: {error}")
