# SPDX-FileCopyrightText: The mediidx developers
# SPDX-License-Identifier: MIT
"""The results as Markdown, and as a picture."""

import datetime
import os
import pathlib
import platform
import subprocess

BEGIN = "<!-- Written by ./dev bench; begin -->"
END = "<!-- Written by ./dev bench; end -->"
OURS = "mediidx"
SERVERS = ("mediidx", "MPD", "MiniDLNA")
ALL = SERVERS + ("TagLib", "COPY")
PACKAGES = {"MPD": "mpd", "MiniDLNA": "minidlna", "TagLib": "libtag1v5", "COPY": "postgresql-15"}
NO_COUNTERS = ("real_time", "cpu_time")
QUIET = 0.05  # Others may take this part of the machine before the figures say less.


def version(package):
    done = subprocess.run(["dpkg-query", "--show", "--showformat=${Version}", package], check=False,
                          text=True, stdout=subprocess.PIPE, stderr=subprocess.DEVNULL)
    # Without epoch and packaging.
    return done.stdout.rpartition(":")[2].split("-")[0].split("+")[0]


def digits(number):
    """Three of them, for people."""
    if number >= 1000:
        return f"{number:,.0f}"
    return f"{number:.{0 if number >= 100 else 1 if number >= 10 else 2 if number >= 1 else 3}f}"


def table(header, rows):
    lines = ["| " + " | ".join(header) + " |", "|---" + "|---:" * (len(header) - 1) + "|"]
    return "\n".join(lines + ["| " + " | ".join(row) + " |" for row in rows])


def row(name, values, with_ratio=True):
    """A line of the table; behind each value how many times ours it is."""
    cells = []
    for system in ALL:
        value = values.get(system)
        if value is None:
            cells.append("")
        elif system == OURS or not with_ratio:
            cells.append(digits(value))
        else:
            cells.append(f"{digits(value)} ({digits(value / values[OURS])}×)")
    return [name, *cells]


class Figures:
    """Values by system, of one piece of work."""

    def __init__(self, results):
        self.results = results

    def of(self, work, value):
        costs = {system: self.results.cost(work, system) for system in ALL}
        return {system: value(cost) for system, cost in costs.items() if cost}

    def seconds(self, work):
        return self.of(work, lambda cost: cost.seconds)

    def cpu(self, work):
        return self.of(work, lambda cost: cost.cpu)

    def megabytes(self, work, part="everything"):
        return {system: getattr(self.results.memory[work, system], part) / 1e6 for system in ALL
                if (work, system) in self.results.memory}


def comparison(results, corpus, large):
    figures = Figures(results)
    first = figures.seconds("first")
    cluster = results.cost("cluster", OURS)
    files = corpus.audio_files

    def block(name, work):
        memory = figures.megabytes(work)
        lines = [row(f"{name}, s", figures.seconds(work)),
                 row("… processor seconds", figures.cpu(work))]
        if memory:
            lines += [row("… peak memory, MB", memory),
                      row("… without the database server, MB",
                          {OURS: figures.megabytes(work, "without_server")[OURS]})]
        return lines

    rows = block(f"**First index** of {files:,} audio files", "first")
    rows.insert(1, row("… with the making of the database, s",
                       {OURS: first[OURS] + cluster.seconds}))
    rows.insert(1, row("… files a second",
                       {system: files / seconds for system, seconds in first.items()}))
    rows += block("**Re-scan**, nothing changed", "rescan")
    rows += block("**Re-scan**, one file changed", "changed")
    rows += block(f"**Re-scan** of {large.audio_files:,} files, nothing changed", "large rescan")
    rows.append(row(f"**First index** of {large.audio_files:,}: peak memory, MB",
                    figures.megabytes("large first")))
    rows.append(row("… without the database server, MB",
                    {OURS: figures.megabytes("large first", "without_server")[OURS]}))
    rows += block("**First index** with photos and videos", "everything")
    names = [OURS, *(f"{name} {version(PACKAGES[name])}" for name in ALL[1:])]
    return table(["", *names], rows)


def goal(name, wanted, found, is_met):
    return [name, wanted, found, "reached" if is_met else "missed"]


def goals(results, files, loops):
    """What was to be reached, with what was."""
    figures = Figures(results)
    first = figures.seconds("first")
    large = figures.seconds("large rescan")
    memory = max(figures.megabytes(work, "without_server")[OURS]
                 for work in ("first", "large first"))
    speed = first["MPD"] / first[OURS]
    part = (first["TagLib"] + first["COPY"]) / first[OURS]
    rescan = large[OURS] / large["MPD"]
    rows = [
        goal(f"first index of {files:,} files against MPD", "2× its speed", f"{digits(speed)}×",
             speed >= 2),
        goal("first index against TagLib and COPY in turn", "0.5× their speed", f"{digits(part)}×",
             part >= 0.5),
        goal(f"unchanged re-scan of {files * 5:,} files against MPD", "1× its time",
             f"{digits(rescan)}×", rescan <= 1),
        goal("memory of command and workers", "128 MB", f"{digits(memory)} MB", memory <= 128),
    ]
    return table(["Goal", "wanted", "found", ""], rows + (goals_of_loops(loops) if loops else []))


def goals_of_loops(loops):
    cases = {case["name"]: case for _, found in loops for case in found}

    def time_of(name):
        return microseconds(cases[name])

    add = next(case["ratio"] for name, case in cases.items() if name.startswith("BM_AddNewSongs"))
    path = max(time_of("BM_PathBelongs/10000"), time_of("BM_PathDoesNotBelong/10000"))
    cue = time_of("BM_CueSheet/12") / time_of("BM_CueRecordsClearedAndCopied/12")
    return [
        goal("a song added by itself against its statements by hand", "2× their time",
             f"{digits(add)}×", add <= 2),
        goal("whether a path belongs, among 10,000 folders", "5 µs", f"{digits(path)} µs",
             path < 5),
        goal("a cue sheet against clearing and copying its records", "2× the time",
             f"{digits(cue)}×", cue <= 2),
    ]


def microseconds(case):
    return case["real_time"] * {"ns": 1e-3, "us": 1, "ms": 1e3, "s": 1e6}[case["time_unit"]]


def counters(case):
    """What a program counted besides the time."""
    return ", ".join(f"{name.replace('_', ' ')} {value:.3g}" for name, value in case.items()
                     if name not in NO_COUNTERS and isinstance(value, float))


def inner_loops(loops):
    rows = [[program.removeprefix("bench_"), f"`{case['name']}`", digits(microseconds(case)),
             counters(case)]
            for program, cases in loops for case in cases]
    return table(["Program", "Case", "µs", "Counted"], rows)


def processor():
    for line in pathlib.Path("/proc/cpuinfo").read_text().splitlines():
        if line.startswith("model name"):
            return " ".join(line.partition(":")[2].split())
    return platform.machine()


def machine():
    memory = os.sysconf("SC_PAGE_SIZE") * os.sysconf("SC_PHYS_PAGES") / 2**30
    return (f"{os.cpu_count()} processors ({processor()}), {memory:.0f} GiB of memory, "
            f"Linux {platform.release().split('-')[0]}")


def conditions(results, corpus):
    others = results.others()
    command = "./dev bench" + ("" if corpus.audio_files == 10000 else f" {corpus.audio_files}")
    text = (f"`{command}` on {datetime.date.today():%Y-%m-%d}; {machine()}. "
            f"The {corpus.audio_files:,} audio files have {digits(corpus.bytes() / 1e6)} MB, all "
            "in the page cache. ")
    if others > QUIET:
        return text + ("**The machine was not quiet: other programs took "
                       f"{others:.0%} of its processors.** Take ratios, not times, and those with "
                       "care.")
    return text + f"Other programs took {others:.1%} of the processors."


def markdown(results, corpus, large, loops):
    parts = [
        conditions(results, corpus),
        "In brackets: how many times that of mediidx.",
        comparison(results, corpus, large),
        "![First index, re-scan and memory as bars](performance.svg)",
        goals(results, corpus.audio_files, loops)]
    if loops:
        parts += ["### Inner loops", inner_loops(loops)]
    return "\n\n".join(parts) + "\n"


def publish(text, results, report, plot):
    """Puts the text between the two marks of the report."""
    old = report.read_text(encoding="utf-8")
    before, begin, rest = old.partition(BEGIN + "\n")
    _, end, after = rest.partition(END)
    if not begin or not end:
        raise RuntimeError(f"{report} has lost its marks")
    report.write_text(f"{before}{begin}\n{text}\n{end}{after}", encoding="utf-8")
    draw(results, plot)


def draw(results, plot):
    figures = Figures(results)
    panels = [("First index, s", figures.seconds("first")),
              ("Unchanged re-scan of five times as many, s", figures.seconds("large rescan")),
              ("Peak memory of the first index, MB", figures.megabytes("first"))]
    script = [
        "set terminal svg size 900,300 font 'sans,11' background rgb 'white'",
        f"set output '{plot}'",
        "set multiplot layout 1,3",
        "set style fill solid",
        "set boxwidth 0.7",
        "unset key",
        "set yrange [0:*]",
        "set xrange [-0.6:*]",
        "set offsets 0, 0.6, graph 0.1, 0",
        "set xtics nomirror rotate by -30",
        "set ytics nomirror",
        "set border 3",
    ]
    for title, values in panels:
        script += ["$bars << END",
                   *(f'{at} "{name}" {value} {"0x2a6f97" if name == OURS else "0x9aa5b1"} '
                     f'"{digits(value)}"' for at, (name, value) in enumerate(values.items())),
                   "END",
                   f"set title '{title}'",
                   "plot $bars using 1:3:4:xtic(2) with boxes linecolor rgb variable, "
                   "$bars using 1:3:5 with labels offset 0,0.6"]
    subprocess.run(["gnuplot"], input="\n".join(script) + "\n", text=True, check=True)
