"""The tables of the report, as Markdown texts."""

from results import columns, series

# Both begin with this library.
PEERS = {
    "VornJsonDb": "**vornjsondb**",
    "CapiPreparedEachTime": "sqlite3 C interface",
    "JsonFunctions": "SQLite's JSON functions + JsonCpp",
    "SqliteCpp": "SQLiteCpp + JsonCpp",
    "Soci": "SOCI + JsonCpp",
    "PocoData": "Poco::Data::SQLite + JsonCpp",
    "QtSql": "Qt 5 SQL + QJson",
}
PEERS_PREPARED_ONCE = {
    "VornJsonDbTable": "**vornjsondb, Table**",
    "CapiPreparedOnce": "sqlite3 C interface",
    "JsonFunctionsPreparedOnce": "SQLite's JSON functions + JsonCpp",
    "SqliteCppPreparedOnce": "SQLiteCpp + JsonCpp",
    "SociPreparedOnce": "SOCI + JsonCpp",
    "PocoDataPreparedOnce": "Poco::Data::SQLite + JsonCpp",
    "QtSqlPreparedOnce": "Qt 5 SQL + QJson",
}
PEER_ROWS = 20000


def markdown(header, rows):
    lines = ["| " + " | ".join(header) + " |"]
    lines.append("|" + "|".join("---" if i == 0 else "--:" for i in range(len(header))) + "|")
    lines += ["| " + " | ".join(str(cell) for cell in row) + " |" for row in rows]
    return "\n".join(lines)


def amount(value, unit):
    """Three digits that count, and a unit that suits them."""
    if unit == "ns" and value >= 1e6:
        value, unit = value / 1e6, "ms"
    elif unit == "ns" and value >= 1e3:
        value, unit = value / 1e3, "us"
    digits = 0 if value >= 100 or value == int(value) else 1 if value >= 10 else 2
    return f"{value:.{digits}f} {unit}"


def goal_cells(figure, goal):
    if goal <= 0:
        return ["", ""]
    return [f"<= {goal:g}" if goal >= 10 else f"<= {goal:.2f}", "met" if figure <= goal else "missed"]


def ratios(rows):
    """Size has a table of its own."""
    header = ["work", "against", "ours", "other", "ratio", "goal", ""]
    body = []
    for row in rows:
        if row["name"] == "size":
            continue
        unit = "" if row["unit"] == "count" else row["unit"]
        body.append(
            [row["work"], row["against"], amount(row["ours"], unit), amount(row["other"], unit)]
            + [f"{row['figure']:.2f}"]
            + goal_cells(row["figure"], row["goal"])
        )
    return markdown(header, body)


def sizes(path):
    goals = {"armhf-O2": 60, "armhf-Os": 50, "armhf-O2-table": 96, "armhf-Os-table": 96}
    titles = {"": "stripped library", "table": "small program, Table's part"}
    body = []
    for build, size in columns(path):
        machine, level, part = (build + "-").split("-")[:3]
        kib = int(size) / 1024
        body.append([titles[part], f"{machine}, -{level}", f"{kib:.1f} KiB"]
                    + goal_cells(kib, goals.get(build, 0)))
    return markdown(["", "built for", "size", "goal (KiB)", ""], sorted(body, key=lambda row: row[0],
                                                                       reverse=True))


def peer_times(entries, work, names):
    """Median time of a call (of a row, for a list) of each peer, in nanoseconds."""
    found = {}
    for name in names:
        entry = entries.get((f"{work}<{name}>", None))
        if entry is not None:
            scale = {"ns": 1.0, "us": 1e3, "ms": 1e6}[entry["time_unit"]]
            found[name] = entry["cpu_time"] * scale / (PEER_ROWS if work == "List" else 1)
    return found


def peers(entries, names):
    """names: {benchmark: title}, the one that all are compared with first."""
    works = ["Create", "Get", "List"]
    times = {work: peer_times(entries, work, names) for work in works}
    ours = next(iter(names))
    body = []
    for name, title in names.items():
        if name not in times["Create"]:
            continue
        row = [title]
        for work in works:
            ratio = times[work][name] / times[work][ours]
            row += [amount(times[work][name], "ns"), f"{ratio:.2f}"]
        body.append(row)
    return markdown(["", "create", "to ours", "fetch", "to ours", "list, per row", "to ours"], body)


def scale_rows(entries):
    hand = dict(series(entries, "ListByHand", "row"))
    get = dict(series(entries, "Get"))
    body = []
    for rows, per_row in series(entries, "List", "row"):
        body.append([f"{rows:,}", amount(per_row * 1e9, "ns"), amount(hand[rows] * 1e9, "ns")]
                    + [f"{per_row / hand[rows]:.2f}", amount(get[rows] * 1e3, "ns")])
    header = ["rows", "recList, per row", "by hand, per row", "ratio", "recGetOne by key"]
    return markdown(header, body)


def flatness(entries):
    """How far the cost of a listed row is from the same at every size, ours and by hand."""
    texts = []
    for name, title in [("List", "recList"), ("ListByHand", "the hand-written list")]:
        costs = [cost for _, cost in series(entries, name, "row")]
        texts.append(f"{title} {max(costs) / min(costs):.2f}")
    return "Dearest row size to cheapest: " + ", ".join(texts) + "."


def scale_columns(entries):
    create, exec_create, get, exec_get = (
        dict(series(entries, name))
        for name in ["CreateColumns", "ExecCreateColumns", "GetColumns", "ExecGetColumns"])
    body = []
    for count in sorted(create):
        row = [count]
        for ours, other in [(create, exec_create), (get, exec_get)]:
            row += [amount(ours[count] * 1e3, "ns"), amount(ours[count] * 1e3 / count, "ns"),
                    f"{ours[count] / other[count]:.2f}"]
        body.append(row)
    return markdown(["columns", "recCreate", "per column", "to exec", "recGetOne", "per column",
                     "to exec"], body)


def scale_texts(entries):
    body = [[f"{length:,}", amount(time * 1e3, "ns")] for length, time in series(entries, "CreateText")]
    return markdown(["bytes of the text", "recCreate"], body)


def scale_tables(entries):
    per_row = dict(series(entries, "ListTables", "row"))
    body = [[count, amount(time * 1e3, "ns"), amount(per_row[count] * 1e9, "ns")]
            for count, time in series(entries, "GetTables")]
    return markdown(["tables", "recGetOne", "recList, per row"], body)


def contention(entries):
    whole = series(entries, "CreateContended", "real_time")
    per_record = dict(series(entries, "CreateContended", "record"))
    failed = dict(series(entries, "CreateContended", "failed"))
    body = [[count, f"{time:.0f} ms", amount(per_record[count] * 1e9, "ns"), f"{failed[count]:.0f}"]
            for count, time in whole]
    return markdown(["processes", "all have finished after", "time per record", "given up"], body)


def instructions(path):
    header = ["", "in all", "vornjsondb", "JsonCpp", "SQLite", "C and C++ libraries"]
    titles = {"create": "recCreate", "get": "recGetOne", "update": "recUpdateByFilter",
              "delete": "recDelete", "list": "recList, one cell",
              "table-create": "Table::Create with the stored row", "table-get": "Table::Get",
              "table-first": "Table::First by key", "table-list": "Table::List, one cell",
              "table-load": "Loader, by setters", "table-json": "Loader, from Json::Value",
              "hand-create": "by hand: create with the stored row", "hand-get": "by hand: get",
              "hand-list": "by hand: list, one cell", "hand-load": "by hand: bind loop"}
    body = [[titles[row[0]]] + [f"{int(cell):,}" for cell in row[1:]] for row in columns(path)]
    return markdown(header, body)


def instructions_to_hand(path):
    """The second handle's counts in multiples of the same work by hand."""
    totals = {row[0]: int(row[1]) for row in columns(path)}
    pairs = [("Table::Create with the stored row", "table-create", "hand-create"),
             ("Table::Get", "table-get", "hand-get"),
             ("Table::First by key", "table-first", "hand-get"),
             ("Table::List, one cell", "table-list", "hand-list"),
             ("Loader, by setters", "table-load", "hand-load"),
             ("Loader, from Json::Value", "table-json", "hand-load")]
    body = [[title, f"{totals[ours]:,}", f"{totals[hand]:,}", f"{totals[ours] / totals[hand]:.2f}"]
            for title, ours, hand in pairs]
    return markdown(["", "instructions", "by hand", "ratio"], body)
