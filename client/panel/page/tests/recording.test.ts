import assert from 'node:assert/strict';
import { test } from 'node:test';
import { gzipSync } from 'node:zlib';
import { Column } from '../src/record/Column';
import { readRecording } from '../src/record/readRecording';
import { SpectrumHistory } from '../src/spectrum/SpectrumHistory';
import { NONE } from '../src/spectrum/quantity';
import { Player } from '../src/record/Player';

const HEADER = '{"format":1,"passwords":false,"recording":"vexa","started":"2026-11-25T14:02:11Z","version":"0.1.0"}';

function line(ms: number, port: string, EventId: string, data?: string): string {
    const event = { ...(data === undefined ? {} : { Data: data }), EventId, Source: 'x', Timestamp: 'y' };
    return JSON.stringify({ event, ms, port });
}

const sample = (ms: number, order: number, value: number) =>
    line(
        ms,
        'sa',
        'SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION',
        `{\n   "congestion_value" : ${value},\n   "order" : ${order}\n}\n`,
    );
const noise = (ms: number, order: number, value: number) =>
    line(ms, 'sa', 'SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE', `{"order":${order},"noise_value":${value}}`);
const channels = (ms: number, numbers: number[]) =>
    line(
        ms,
        'sa',
        'SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G',
        JSON.stringify(numbers.map((Channel, i) => ({ Channel, Order: i + 1 }))),
    );
const networks = (ms: number, ...names: string[]) =>
    line(ms, 'hs20', 'GET_ALL_NETWORK_LIST', JSON.stringify(names.map((NetWorkName) => ({ NetWorkName }))));

function streamOf(bytes: Uint8Array, piece: number): ReadableStream<Uint8Array<ArrayBuffer>> {
    const pieces = Array.from({ length: Math.ceil(bytes.length / piece) }, (_, i) =>
        bytes.slice(i * piece, (i + 1) * piece),
    );
    return new ReadableStream({
        start(controller) {
            for (const next of pieces) controller.enqueue(next);
            controller.close();
        },
    });
}

const read = (text: string | Uint8Array, piece = 7) =>
    readRecording(
        streamOf(typeof text === 'string' ? new TextEncoder().encode(text) : text, piece),
        () => {},
        new AbortController().signal,
    );

const STORY = [
    HEADER,
    channels(1, [1, 36]),
    line(2, 'hs20', 'CARD_PLUG_IN', ''),
    networks(3, 'Café', 'Library'),
    sample(100, 1, 30),
    noise(100, 1, 40),
    sample(200, 2, 50),
    networks(500, 'Library'),
    sample(700, 1, 60),
    '{"end":true,"ms":1000}',
];

test('a recording is read in pieces, compressed or not, whole or cut off', async () => {
    const text = `${STORY.join('\n')}\n`;
    const packed = gzipSync(text);
    const cut = text.slice(0, text.indexOf('"congestion_value\\" : 60'));
    const cases: [string, string | Uint8Array, boolean, number, number][] = [
        ['plain', text, true, 4, 4],
        ['with the line ends of Windows', text.replaceAll('\n', '\r\n'), true, 4, 4],
        ['compressed', packed, true, 4, 4],
        ['cut off in a line', cut, false, 3, 4],
        ['the header alone', HEADER, false, 0, 0],
    ];
    for (const [name, bytes, isWhole, samples, events] of cases) {
        const index = await read(bytes);
        assert.deepEqual([index.isWhole, index.sampleCount, index.eventCount], [isWhole, samples, events], name);
        assert.equal(index.header.started, Date.parse('2026-11-25T14:02:11Z'), name);
    }
    const broken = await read(packed.subarray(0, packed.length - 12), 64);
    assert.equal(broken.isWhole, false);
});

test('what is no recording is refused', async () => {
    const cases: [string, string, RegExp][] = [
        ['nothing', '', /no recording/],
        ['another file', 'a,b,c\n1,2,3\n', /no recording/],
        ['a later format', HEADER.replace('"format":1', '"format":2'), /later/],
        ['a line that is none', `${HEADER}\n${sample(1, 1, 1)}\n{"ms":3}\n`, /Line 3/],
    ];
    for (const [name, text, expected] of cases) await assert.rejects(read(text), expected, name);
});

test('events are found by time, and read back', async () => {
    const index = await read(STORY.join('\n'));
    const latest = async (time: number) =>
        (await Promise.all(index.latestEvents(time).map((place) => index.event(place)))).map(
            ({ id, at }) => `${id} ${at}`,
        );
    assert.deepEqual(await latest(0), []);
    assert.deepEqual(await latest(499), [
        'SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G 1',
        'CARD_PLUG_IN 2',
        'GET_ALL_NETWORK_LIST 3',
    ]);
    assert.equal((await latest(500)).at(-1), 'GET_ALL_NETWORK_LIST 500');
    assert.deepEqual((await index.event(2)).data, [{ NetWorkName: 'Café' }, { NetWorkName: 'Library' }]);
    assert.deepEqual(index.sample(1), { at: 100, order: 1, quantity: 'interference', level: 40 });
});

test('a column of numbers is searched across its blocks', () => {
    const column = new Column(Uint32Array);
    for (let i = 0; i < 100_000; i++) column.push(Math.floor(i / 2));
    assert.deepEqual(
        [-1, 0, 20_000, 49_999].map((value) => column.firstAbove(value)),
        [0, 2, 40_002, 100_000],
    );
    assert.equal(column.at(70_001), 35_000);
});

const settled = async (player: Player, position: number) => {
    await player.seek(position);
    return player.source;
};

test('a seek shows what there was, however far the values go back', async () => {
    const lines = [HEADER, channels(0, [1, 36]), line(0, 'sa', 'RADIO_ON'), sample(10, 2, 77)];
    for (let ms = 20; ms < 3_600_000; ms += 5000) {
        lines.push(sample(ms, 1, Math.floor(ms / 5000) % 100));
        if (ms === 1_800_020) lines.push(networks(ms, 'Library'));
    }
    lines.push(sample(3_600_000, 1, 5));
    const player = new Player('case', await read(lines.join('\n'), 4096));
    const cases: [number, number, number, number | undefined][] = [
        [0, NONE, NONE, undefined],
        [3_000_000, 99, 77, 1],
        [1_000_000, 99, 77, undefined],
        [3_600_000, 5, 77, 1],
    ];
    for (const [position, first, second, count] of cases) {
        const { spectrum, service } = await settled(player, position);
        assert.deepEqual(
            [spectrum.current('congestion', 0), spectrum.current('congestion', 1)],
            [first, second],
            `${position}`,
        );
        assert.equal(service.state.get().networks?.length, count, `${position}`);
    }
    const { spectrum } = await settled(player, 3_000_000);
    assert.equal(spectrum.level('congestion', spectrum.endStep - 1 - 300, 0), 93);
});

test('values of another list of channels are void after a seek, too', async () => {
    const lines = [
        HEADER,
        channels(0, [1, 36]),
        sample(10, 1, 20),
        channels(40_000, [6]),
        sample(90_000, 2, 1),
        sample(700_000, 2, 2),
    ];
    const player = new Player('case', await read(lines.join('\n'), 4096));
    const { spectrum } = await settled(player, 700_000);
    assert.deepEqual([spectrum.channels.length, spectrum.current('congestion', 0)], [1, NONE]);
    assert.ok(spectrum instanceof SpectrumHistory);
});
