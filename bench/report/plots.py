"""The plots of the report, drawn by gnuplot as SVG files."""

import subprocess

from results import series
from tables import peer_times

HEAD = """
set terminal svg size 760,420 font 'sans-serif,13' background '#ffffff'
set output '{file}'
set title '{title}'
set xlabel '{x}'
set ylabel '{y}'
set grid ytics lc rgb '#dddddd'
set border 3
set tics nomirror
set style line 1 lc rgb '#1f5fa8' lw 2 pt 7 ps 0.6
set style line 2 lc rgb '#7fb0dd' lw 2 pt 6 ps 0.6 dt 2
set style line 3 lc rgb '#c8641b' lw 2 pt 5 ps 0.6
set style line 4 lc rgb '#e7b48c' lw 2 pt 4 ps 0.6 dt 2
"""


def draw(script):
    subprocess.run(["gnuplot"], input=script, text=True, check=True)


def block(name, rows):
    return f"${name} << END\n" + "\n".join(" ".join(str(cell) for cell in row) for row in rows) + "\nEND\n"


def lines(file, title, x, y, curves, settings):
    """curves: {title: [(x, y)]}."""
    script = HEAD.format(file=file, title=title, x=x, y=y) + settings + "\n"
    plots = []
    for i, (name, rows) in enumerate(curves.items(), 1):
        script += block(f"data{i}", rows)
        plots.append(f"$data{i} using 1:2 with linespoints ls {i} title '{name}'")
    draw(script + "plot " + ", ".join(plots) + "\n")


def per_unit(pairs):
    return [(count, time / count) for count, time in pairs]


def columns(entries, file):
    curves = {"recCreate": per_unit(series(entries, "CreateColumns")),
              "exec of its text": per_unit(series(entries, "ExecCreateColumns")),
              "recGetOne": per_unit(series(entries, "GetColumns")),
              "exec of its text ": per_unit(series(entries, "ExecGetColumns"))}
    lines(file, "Cost of one column", "columns of the table", "microseconds a column", curves,
          "set logscale x 2\nset yrange [0:*]\nset key top right")


def rows(entries, file):
    curves = {"recList": [(count, cost * 1e6) for count, cost in series(entries, "List", "row")],
              "hand-written list": [(count, cost * 1e6)
                                    for count, cost in series(entries, "ListByHand", "row")]}
    lines(file, "Cost of one listed row of eight columns", "rows listed", "microseconds a row", curves,
          "set logscale x 10\nset format x '%.0s%c'\nset yrange [0:*]\nset key bottom right")


def texts(entries, file):
    lines(file, "Creating a record with one long text", "bytes of the text", "microseconds",
          {"recCreate": series(entries, "CreateText")},
          "set logscale xy\nset xrange [10:2e6]\nset key top left\nset mxtics 1\n"
          "set xtics ('16' 16, '64' 64, '512' 512, '4 KiB' 4096, '32 KiB' 32768, "
          "'256 KiB' 262144, '1 MiB' 1048576)")


def peers(entries, titles, file):
    """Bars of time in multiples of the first one of titles, {benchmark: title}."""
    works = ["Create", "Get", "List"]
    times = {work: peer_times(entries, work, titles) for work in works}
    names = [name for name in titles if name in times["Create"]]
    script = HEAD.format(file=file, title="Time in multiples of this library (less is better)", x="", y="")
    script += """
set terminal svg size 760,560 font 'sans-serif,13' background '#ffffff'
set style fill solid 1.0
set grid noytics xtics
set yrange [*:*] reverse
set xrange [0:*]
set key outside bottom center horizontal
set ytics out scale 0
set arrow from 1, graph 0 to 1, graph 1 nohead lc rgb '#444444' front
"""
    colours = ["#1f5fa8", "#7fb0dd", "#c8641b"]
    legend = ["create", "fetch", "list"]
    plots = []
    for i, work in enumerate(works):
        rows = [(n + (i - 1) * 0.25, times[work][name] / times[work][names[0]])
                for n, name in enumerate(names)]
        script += block(f"data{i}", rows)
        plots.append(f"$data{i} using (0.5*$2):1:(0.5*$2):(0.11) with boxxyerror lc rgb '{colours[i]}' "
                     f"title '{legend[i]}'")
    ticks = ", ".join(f"'{label(titles[name])}' {n}" for n, name in enumerate(names))
    draw(script + f"set ytics ({ticks})\nplot " + ", ".join(plots) + "\n")


def label(title):
    """One quote would end gnuplot's text."""
    return title.replace("*", "").replace("'", "''")
