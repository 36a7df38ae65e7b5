#!/usr/bin/env python3
"""Real files go in and come out again, and every record is compared as exact JSON values."""

import glob
import os
import sys

sys.dont_write_bytecode = True
from Compare import *  # noqa: F403

check = Checks()
VEGA = 'python3-vega-datasets/usr/lib/python3/dist-packages/vega_datasets/_data/'
ISO = 'iso-codes/usr/share/iso-codes/json/'
STATS = 'python3-statsmodels/usr/lib/python3/dist-packages/statsmodels/'
PATHSPIDER = 'pathspider/usr/lib/python3/dist-packages/pathspider/tests/data/'

# File and records. A list of records, or an object with one such list.
JSON_FILES = [
    (ISO + 'iso_15924.json', 182), (ISO + 'iso_3166-1.json', 249), (ISO + 'iso_3166-2.json', 5127),
    (ISO + 'iso_3166-3.json', 31), (ISO + 'iso_4217.json', 181), (ISO + 'iso_639-2.json', 487),
    (ISO + 'iso_639-3.json', 7910), (ISO + 'iso_639-5.json', 115),
    (VEGA + 'barley.json', 120), (VEGA + 'ohlc.json', 44), (VEGA + 'wheat.json', 52),
    (VEGA + 'burtin.json', 16), (VEGA + 'cars.json', 406), (VEGA + 'anscombe.json', 44),
    (VEGA + 'crimea.json', 24), (VEGA + 'driving.json', 55), (VEGA + 'iris.json', 150),
]
JSON_LINES_FILES = [
    (PATHSPIDER + 'webtest.ndjson', 10), (PATHSPIDER + 'webtest_duplicates.ndjson', 14),
    (PATHSPIDER + 'webtest_newline.ndjson', 10),
]
# File, records and options. Delimiter, header and quotes are the second reader's, too.
CSV_FILES = [
    ('ieee-data/usr/share/ieee-data/oui.csv', 32530, []),
    ('ieee-data/usr/share/ieee-data/mam.csv', 4390, []),
    ('ieee-data/usr/share/ieee-data/oui36.csv', 5029, []),
    ('ieee-data/usr/share/ieee-data/iab.csv', 4575, []),
    (VEGA + 'airports.csv', 3376, []), (VEGA + 'seattle-temps.csv', 8759, []),
    (VEGA + 'stocks.csv', 560, []), (VEGA + 'us-employment.csv', 120, []),
    (VEGA + 'iowa-electricity.csv', 51, []), (VEGA + 'seattle-weather.csv', 1461, []),
    (VEGA + 'sf-temps.csv', 8759, []),
    ('mstflint/usr/share/mstflint/Spectrum4.csv', 153794, []),
    (STATS + 'datasets/randhie/randhie.csv', 20190, []),
    (STATS + 'datasets/danish_data/data.csv', 55, []),
    ('unicode-data/usr/share/unicode/UnicodeData.txt', 34924,
     ['--delimiter', ';', '--no-header', '--quote', 'none']),
]
# What no table can be made from, and what is said of it.
LEAVE_OUT = '; correct it, or leave it out by --errors FILE'
REFUSED = [
    ('node-caniuse-db/usr/share/nodejs/caniuse-db/data.json',
     ':1: the input is one large object, and no list of records; take the list out of it, or put it '
     'on one line and use --format jsonl'),
    (STATS + 'regression/tests/results/dietox.csv',
     ':2: the row has 8 cells, but there are 7 columns' + LEAVE_OUT),
    (STATS + 'tsa/tests/results/arima212_forecast.csv',
     ':3: the row has 5 cells, but there are 6 columns' + LEAVE_OUT),
    ('tzdata/usr/share/zoneinfo/zone1970.tab', ':11: the row has 2 cells, but there is 1 column' + LEAVE_OUT),
    ('unicode-data/usr/share/unicode/UnicodeData.txt', ':1: column 6 has no name; --no-header is for input without names'),
]


def Import(database, path, *options):
    done = Run('insert', database, 't', path, '--quiet', *options)
    check.Same(f'import of {path}', (done.code, done.out, done.errors), (0, b'', ''))


def Export(database, form):
    done = Run('list', database, 't', '--format', form)
    check.Same(f'export as {form}', (done.code, done.errors), (0, ''))
    return done


def JsonGivenBack(path, records, lines):
    given = open(path, encoding='utf-8').read()
    expected = [Exact(line) for line in given.split('\n') if line] if lines else Exact(given)
    if isinstance(expected, dict):
        (expected,) = expected.values()
    check.Same(f'{path}: records by another reader', len(expected), records)
    with Folder() as folder:
        Import(folder + '/a.db', path)
        exported = Export(folder + '/a.db', 'jsonl')
        check.SameRecords(path, exported.records(), expected)
        as_list = Export(folder + '/a.db', 'json')
        check.SameRecords(f'{path} as a list', Exact(as_list.out), expected)
        # What was exported goes in again.
        with open(folder + '/again.json', 'wb') as again:
            again.write(as_list.out)
        Import(folder + '/b.db', folder + '/again.json')
        check.Same(f'{path}, from its export', Export(folder + '/b.db', 'jsonl').out, exported.out)


def CsvGivenBack(path, records, options):
    with open(path, encoding='utf-8-sig', newline='') as file:
        rows = Cells(file.read(), ';' if ';' in options else ',', 'none' not in options)
    names = [f'c{number}' for number in range(1, len(rows[0]) + 1)]
    if '--no-header' not in options:
        names = rows.pop(0)
    if records is not None:
        check.Same(f'{path}: records by another reader', len(rows), records)
    with Folder() as folder:
        Import(folder + '/a.db', path, *options)
        exported = Export(folder + '/a.db', 'jsonl')
        found = exported.records()
        check.Same(f'{path}: exported records', len(found), len(rows))
        for number, (record, row) in enumerate(zip(found, rows), 1):
            # A member that is never NULL has no null to show.
            if not all(IsCell(record.get(name), cell) for name, cell in zip(names, row)):
                check.Same(f'{path}: record {number}', record, dict(zip(names, row)))
                break
        for form in ('csv', 'tsv'):
            again = Export(folder + '/a.db', form)
            with open(f'{folder}/again.{form}', 'wb') as file:
                file.write(again.out)
            Import(f'{folder}/{form}.db', f'{folder}/again.{form}', '--format', form)
            check.Same(f'{path}, from its export as {form}',
                       Export(f'{folder}/{form}.db', 'jsonl').out, exported.out)
    return len(rows)


def ExpectedOfSpectrum():
    """Small files that come with the records that they hold, all cells as texts."""
    folder = FILES + '/node-csv-spectrum/usr/share/nodejs/csv-spectrum/'
    names = sorted(os.path.basename(path)[:-4] for path in glob.glob(folder + 'csvs/*.csv'))
    check.Same('files with expected records', len(names), 11)
    for name in names:
        with Folder() as place:
            path = f'{folder}csvs/{name}.csv'
            header = Cells(open(path, encoding='utf-8', newline='').read())[0]
            texts = [word for each in header for word in ('--type', f'{each}=string')]
            Import(place + '/a.db', path, '--empty', 'text', *texts)
            expected = Exact(open(f'{folder}json/{name}.json', encoding='utf-8').read())
            check.SameRecords(path, Export(place + '/a.db', 'jsonl').records(), expected)


def AllRefused():
    for path, reason in REFUSED:
        with Folder() as folder:
            full = f'{FILES}/{path}'
            done = Run('insert', folder + '/a.db', 't', full)
            check.Same(f'refusal of {path}', (done.code, done.out, done.errors),
                       (3, b'', f'error: {full}{reason} (nothing is stored)\n'))
            check.Same(f'no database after {path}', os.listdir(folder), [])


for path, records in JSON_FILES:
    JsonGivenBack(f'{FILES}/{path}', records, False)
for path, records in JSON_LINES_FILES:
    JsonGivenBack(f'{FILES}/{path}', records, True)
for path, records, options in CSV_FILES:
    CsvGivenBack(f'{FILES}/{path}', records, options)
tables = sorted(glob.glob(FILES + '/gdal-data/usr/share/gdal/grib2_table_4_2_*.csv'))
check.Same('tables of one kind', (len(tables), sum(CsvGivenBack(path, None, []) for path in tables)),
           (58, 12658))
ExpectedOfSpectrum()
AllRefused()
check.Finish()
