import assert from 'node:assert/strict';
import { test } from 'node:test';
import { blockName, blocksOf, needsRadarDetection, rankBlocks, reasonFor, type Width } from '../src/spectrum/blocks';

const EUROPE = [1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 36, 40, 44, 48, 52, 56, 60, 64, 100, 104, 108, 112];
const names = (listed: number[], width: Width) => blocksOf(listed, width).map(blockName);

test('a block is there where the adapter lists all of it', () => {
    const cases: [string, number[], Width, string[]][] = [
        ['20 MHz', [1, 6, 11, 36, 165], 20, ['1', '6', '11', '36', '165']],
        ['2.4 GHz alone, between the three', [2, 3, 7], 20, []],
        ['40 MHz in 2.4 GHz', [1, 5, 9, 11, 13], 40, ['1 + 5', '5 + 9', '9 + 13']],
        ['40 MHz in 5 GHz', [36, 40, 44, 48, 52, 60, 64], 40, ['36\u201340', '44\u201348', '60\u201364']],
        ['not across the pairs', [40, 44], 40, []],
        ['80 MHz', EUROPE, 80, ['36\u201348', '52\u201364', '100\u2013112']],
        ['80 MHz in the upper run', [149, 153, 157, 161, 165], 80, ['149\u2013161']],
        ['not over a gap', [36, 40, 48, 52], 80, []],
        ['nothing listed', [], 80, []],
    ];
    for (const [name, listed, width, expected] of cases) assert.deepEqual(names(listed, width), expected, name);
});

test('a channel of 2.4 GHz covers its neighbours', () => {
    const [first, sixth] = blocksOf(EUROPE, 20);
    assert.deepEqual(first.covered, [1, 2, 3]);
    assert.deepEqual(sixth.covered, [4, 5, 6, 7, 8]);
    assert.deepEqual(blocksOf(EUROPE, 40)[8].covered, [7, 8, 9, 10, 11, 12, 13]);
});

type Loads = Record<number, [mean: number, now?: number, interference?: number]>;

const rankOf = (loads: Loads, width: Width) =>
    rankBlocks(
        Object.entries(loads).map(([number, [mean, now = mean, interference = 30]]) => ({
            number: Number(number),
            mean,
            now,
            interference,
        })),
        width,
    );

test('the best block comes first', () => {
    const cases: [string, Loads, Width, string[]][] = [
        ['the calmest', { 36: [40], 40: [10], 44: [20] }, 20, ['40', '44', '36']],
        [
            'by its worst channel: a lower mean does not help',
            { 36: [0], 40: [60], 44: [35], 48: [35] },
            40,
            ['44\u201348', '36\u201340'],
        ],
        ['a neighbour in 2.4 GHz counts', { 1: [5], 2: [70], 6: [30], 11: [40] }, 20, ['6', '11', '1']],
        ['of like means what is there now', { 36: [20, 90], 40: [20, 10] }, 20, ['40', '36']],
        ['of like ones that without radar', { 52: [20], 149: [20] }, 20, ['149', '52']],
        ['a hair does not outweigh that', { 52: [19.9], 149: [20] }, 20, ['149', '52']],
        ['of equals the lower', { 44: [20], 36: [20] }, 20, ['36', '44']],
        ['interference decides between like ones', { 36: [20, 20, 100], 40: [20, 20, 5] }, 20, ['40', '36']],
        ['what is not known is left out', { 36: [NaN], 40: [10] }, 20, ['40']],
        ['where nothing is told now the mean counts', { 36: [20, 90], 40: [20, NaN] }, 20, ['40', '36']],
        ['a block with an unknown channel, too', { 36: [NaN], 40: [10] }, 40, []],
    ];
    for (const [name, loads, width, expected] of cases)
        assert.deepEqual(rankOf(loads, width).map(blockName), expected, name);
});

test('the reason is a sentence', () => {
    const cases: [Loads, Width, RegExp][] = [
        [
            { 36: [10, 12, 25], 40: [30] },
            20,
            /^On 36 congestion was 10.%.*is 12.% now, interference \u221295.dBm; 40 .* 30.%\.$/,
        ],
        [
            { 52: [10, 12, 25], 56: [20] },
            40,
            /^On 52\u201356 its busiest channel, 56, was at 20.%.*15.%.*20.%.*radar\.$/,
        ],
        [{ 36: [10, NaN, 25] }, 20, /^On 36 congestion was 10.% on average, interference \u221295.dBm\.$/],
    ];
    for (const [loads, width, expected] of cases) assert.match(reasonFor(rankOf(loads, width)), expected);
    assert.equal(needsRadarDetection(blocksOf(EUROPE, 80)[0]), false);
    assert.equal(needsRadarDetection(blocksOf(EUROPE, 80)[1]), true);
});
