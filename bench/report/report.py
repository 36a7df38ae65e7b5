"""report.py RESULTS DOCS: writes tables into DOCS/performance.md and plots beside it.

Each table stands in a block of the page: see scripts/figures.py.
"""

import json
import os
import pathlib
import sys

sys.path.insert(0, str(pathlib.Path(__file__).parents[2] / "scripts"))

import figures
import machine
import plots
import tables
from results import medians


def main(results, docs):
    with open(os.path.join(results, "ratios.json")) as file:
        ratios = json.load(file)
    with open(os.path.join(results, "command.json")) as file:
        command = json.load(file)
    scale = medians(os.path.join(results, "scale.json"))
    peers = medians(os.path.join(results, "peers.json"))
    contents = {
        "machine": machine.describe(results),
        "ratios": tables.ratios(ratios),
        "command": tables.ratios(command),
        "sizes": tables.sizes(os.path.join(results, "sizes.txt")),
        "peers": tables.peers(peers, tables.PEERS),
        "peers-prepared-once": tables.peers(peers, tables.PEERS_PREPARED_ONCE),
        "rows": tables.scale_rows(scale) + "\n\n" + tables.flatness(scale),
        "columns": tables.scale_columns(scale),
        "texts": tables.scale_texts(scale),
        "tables": tables.scale_tables(scale),
        "contention": tables.contention(scale),
        "instructions": tables.instructions(os.path.join(results, "instructions.txt")),
        "instructions-to-hand": tables.instructions_to_hand(
            os.path.join(results, "instructions.txt")),
    }
    report = os.path.join(docs, "performance.md")
    figures.write(report, contents)

    folder = os.path.join(docs, "performance")
    os.makedirs(folder, exist_ok=True)
    plots.columns(scale, os.path.join(folder, "columns.svg"))
    plots.rows(scale, os.path.join(folder, "rows.svg"))
    plots.texts(scale, os.path.join(folder, "texts.svg"))
    plots.peers(peers, tables.PEERS, os.path.join(folder, "peers.svg"))
    plots.peers(peers, tables.PEERS_PREPARED_ONCE,
                os.path.join(folder, "peers-prepared-once.svg"))
    print(f"wrote {report}")


if __name__ == "__main__":
    if len(sys.argv) != 3:
        sys.exit(__doc__)
    main(sys.argv[1], sys.argv[2])
