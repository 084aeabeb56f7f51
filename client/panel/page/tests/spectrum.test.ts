import assert from 'node:assert/strict';
import { test } from 'node:test';
import { readEvent } from '../src/app/protocol';
import { columnAt, frequencyOf, groupChannels, placeGroups } from '../src/spectrum/channels';
import { LEVEL_COLOURS } from '../src/spectrum/colours';
import { spectrumText } from '../src/spectrum/export';
import { figure, NONE } from '../src/spectrum/quantity';
import { KEPT_STEPS, SpectrumHistory, STEP } from '../src/spectrum/SpectrumHistory';
import { statisticsOf } from '../src/spectrum/statistics';
import { ROWS, WaterfallRows } from '../src/spectrum/WaterfallRows';

const CHANNELS = [
    { Channel: 1, Order: 2 },
    { Channel: 36, Order: 1 },
];
const [FIRST, SECOND] = [0, 1];

function spectral(id: string, at: number, data?: unknown) {
    const message = { EventId: id, ...(data === undefined ? {} : { Data: JSON.stringify(data) }) };
    return readEvent('spectral', message, at)!;
}

const list = (at = 0, channels: unknown = CHANNELS) =>
    spectral('SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G', at, channels);
const congestion = (at: number, order: number, value: number) =>
    spectral('SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION', at, { congestion_value: value, order });

function historyOf(events: ReturnType<typeof spectral>[], end: number, patience = Infinity): SpectrumHistory {
    const history = new SpectrumHistory();
    history.patience = patience;
    history.advance(0);
    for (const event of events) history.take(event);
    history.advance(end);
    return history;
}

const rowsOf = (history: SpectrumHistory, column: number) =>
    Array.from({ length: history.endStep - history.firstStep }, (_, i) =>
        history.level('congestion', history.firstStep + i, column),
    );

test('a level stands in the rows until another is told, and none where none can be', () => {
    const N = NONE;
    const cases: [string, ReturnType<typeof spectral>[], number[], number?][] = [
        ['told before the first row ends', [list(), congestion(10, 2, 30)], [30, 30, 30, 30]],
        ['another one', [list(), congestion(10, 2, 30), congestion(250, 2, 50)], [30, 30, 50, 50]],
        ['told before the list', [congestion(0, 2, 30), list(10)], [30, 30, 30, 30]],
        ['the same list keeps it', [list(), congestion(10, 2, 30), list(210)], [30, 30, 30, 30]],
        [
            'the radio off',
            [list(), congestion(10, 2, 30), spectral('RADIO_OFF', 150), spectral('RADIO_ON', 350)],
            [30, N, N, 30],
        ],
        ['the adapter out', [list(), congestion(10, 2, 30), spectral('CARD_PLUG_OUT', 250)], [30, 30, N, N]],
        ['silence', [list(), congestion(10, 2, 30)], [30, 30, 30, N], 200],
        ['out of range', [list(), congestion(10, 2, 101)], [N, N, N, N]],
    ];
    for (const [name, events, expected, patience] of cases)
        assert.deepEqual(rowsOf(historyOf(events, 400, patience), FIRST), expected, name);
});

test('of two values of a channel the one that is not told is 0', () => {
    const history = historyOf([list(), congestion(10, 2, 30)], 400);
    const levels = [0, 1, 2].map((step) => history.level('interference', step, FIRST));
    assert.deepEqual(levels, [NONE, 0, 0]);
    assert.equal(history.current('interference', SECOND), NONE);
});

test('another list makes values void and begins anew', () => {
    const history = historyOf([list(), congestion(10, 2, 30), list(200, [{ Channel: 6, Order: 2 }])], 400);
    assert.deepEqual(history.channels, [{ number: 6, order: 2 }]);
    assert.equal(history.current('congestion', 0), NONE);
});

test('what is kept is bounded, and sums go on', () => {
    const history = historyOf([list(), congestion(0, 2, 100)], STEP * 10);
    history.take(congestion(STEP * 10, 2, 0));
    history.advance(STEP * (KEPT_STEPS + 10));
    assert.equal(history.endStep - history.firstStep, KEPT_STEPS);
    assert.equal(history.level('congestion', 9, FIRST), NONE);
    assert.deepEqual(statisticsOf(history, 'congestion', 30_000)[FIRST], { mean: 0, least: 0, greatest: 0 });
    const all = statisticsOf(history, 'congestion', Infinity)[FIRST];
    assert.deepEqual([all.least, all.greatest], [0, 100]);
    assert.ok(Math.abs(all.mean - 1000 / (KEPT_STEPS + 10)) < 1e-9);
    assert.ok(Number.isNaN(statisticsOf(history, 'congestion', Infinity)[SECOND].mean));
});

test('statistics are of the window alone', () => {
    const events = [list(), congestion(0, 2, 80), congestion(1000, 2, 20), congestion(1500, 2, 40)];
    const history = historyOf(events, 2000);
    const cases: [number, number | undefined, number, number, number][] = [
        [1000, undefined, 30, 20, 40],
        [500, undefined, 40, 40, 40],
        [1000, 10, 80, 80, 80],
        [30_000, undefined, 55, 20, 80],
    ];
    for (const [length, end, mean, least, greatest] of cases)
        assert.deepEqual(statisticsOf(history, 'congestion', length, end)[FIRST], { mean, least, greatest });
});

test('a row of a waterfall has the greatest level of its time, and stays when the history has let it go', () => {
    const history = historyOf(
        [list(), congestion(0, 2, 10), congestion(30_000, 2, 90), congestion(30_100, 2, 10)],
        60_000,
    );
    const rows = new WaterfallRows(history, 600_000);
    rows.fill();
    const row = (time: number) => Math.floor(time / rows.rowTime);
    const level = (time: number) => rows.level('congestion', row(time), FIRST);
    assert.deepEqual([0, 28_000, 30_000, 32_000, 60_000].map(level), [10, 10, 90, 10, NONE]);
    history.advance(600_000 + 30_000);
    assert.deepEqual([30_000, 61_000].map(level), [90, NONE]);
    rows.fill();
    assert.equal(rows.end, row(630_000));
    assert.deepEqual([29_000, 30_000, 629_000].map(level), [NONE, 90, 10]);
    const slots = new Set(Array.from({ length: ROWS }, (_, i) => WaterfallRows.slotOf(rows.end - 1 - i)));
    assert.equal(slots.size, ROWS);
    history.clear();
    assert.equal(rows.isOf(history), false);
});

test('channels stand in groups, with gaps that belong to none', () => {
    const numbers = [1, 2, 13, 36, 40, 64, 100, 144, 149, 165];
    const groups = groupChannels(numbers.map((number) => ({ number, order: number })));
    assert.deepEqual(
        groups.map(({ band, first, count }) => [band, first, count]),
        [
            ['2.4 GHz', 0, 2],
            ['2.4 GHz', 2, 1],
            ['5 GHz', 3, 2],
            ['5 GHz', 5, 1],
            ['5 GHz', 6, 1],
            ['5 GHz', 7, 1],
            ['5 GHz', 8, 1],
            ['5 GHz', 9, 1],
        ],
    );
    const placed = placeGroups([groups[0], groups[2]], 10, 60, 10);
    const columns = [9, 10, 19, 20, 30, 39, 40, 50, 60].map((x) => columnAt(placed, x));
    assert.deepEqual(columns, [-1, 0, 0, 1, -1, -1, 3, 4, -1]);
    assert.deepEqual([1, 13, 14, 36, 165].map(frequencyOf), [2412, 2472, 2484, 5180, 5825]);
});

test('the colours rise evenly in lightness', () => {
    const light = LEVEL_COLOURS.map(
        ([red, green, blue]) => 0.2126 * red ** 2.2 + 0.7152 * green ** 2.2 + 0.0722 * blue ** 2.2,
    );
    for (let level = 2; level < light.length; level++) assert.ok(light[level] > light[level - 2], `level ${level}`);
});

test('levels read in their unit', () => {
    assert.deepEqual(
        [figure('congestion', 42), figure('interference', 42), figure('interference', NaN), figure('congestion', NONE)],
        ['42', '\u221278', '\u2013', '\u2013'],
    );
});

test('what is saved has a line for each change', () => {
    const history = historyOf([list(), congestion(50, 2, 30), congestion(250, 2, 40)], 400);
    const csv = spectrumText(history, 'csv', 30_000, history.endStep, 0).join('').trim().split('\n');
    assert.deepEqual(csv, [
        'time,channel,mhz,congestion_percent,interference_dbm',
        '1970-01-01T00:00:00.000Z,1,2412,30,',
        '1970-01-01T00:00:00.000Z,36,5180,,',
        '1970-01-01T00:00:00.100Z,1,2412,30,-120',
        '1970-01-01T00:00:00.200Z,1,2412,40,-120',
    ]);
    const json = spectrumText(history, 'jsonl', 30_000, history.endStep, 0).join('').trim().split('\n');
    assert.deepEqual(JSON.parse(json[2]).interference_dbm, -120);
    assert.equal(json.length, csv.length - 1);
});
