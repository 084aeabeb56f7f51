import assert from 'node:assert/strict';
import { test } from 'node:test';
import { reconnectDelay } from '../src/app/link';
import { ScanKeeper } from '../src/spectrum/scan';

/** A story: at a time values come ('v'), or the keeper looks. Tells when a scan was asked for. */
function asked(values: number[], end: number) {
    const history = { told: 0, lastTold: -Infinity };
    const times: number[] = [];
    let now = 0;
    const keeper = new ScanKeeper({ ask: (_, id) => void times.push(id === 'FULL_SCAN' ? now : -1) }, history);
    keeper.start(0);
    for (; now <= end; now += 250) {
        if (values.includes(now)) {
            history.told++;
            history.lastTold = now;
        }
        keeper.look(now);
    }
    return { times, resumed: keeper.resumed.get(), keeper };
}

test('a scan that falls silent is asked for again', () => {
    const every = (step: number, end: number) => Array.from({ length: end / step }, (_, i) => (i + 1) * step);
    const cases: [string, number[], number, number[], boolean][] = [
        ['values come', every(500, 5000), 5000, [0], false],
        ['none ever: asked less and less often', [], 10_000, [0, 1750, 5000], false],
        ['none any more', [250, 500], 4000, [0, 2250, 4000], false],
        ['they come back', [250, 500, 2500, 2750], 3000, [0, 2250], true],
        ['a slow adapter sets the pace', [1500, 4250], 7000, [0], false],
    ];
    for (const [name, values, end, times, resumed] of cases) {
        const story = asked(values, end);
        assert.deepEqual(story.times, times, name);
        assert.equal(story.resumed, resumed, name);
    }
});

test('a scan that was stopped stays so', () => {
    const { keeper, times } = asked([], 0);
    keeper.stop();
    keeper.stop();
    keeper.look(60_000);
    assert.deepEqual(times, [0, -1]);
});

test('the link waits longer after each failure, up to a limit', () => {
    const delays = [0, 1, 2, 3, 4, 5, 50].map((failures) => reconnectDelay(failures, 0.5));
    assert.deepEqual(delays, [250, 500, 1000, 2000, 4000, 5000, 5000]);
    assert.deepEqual([reconnectDelay(0, 0), reconnectDelay(0, 1)], [187.5, 312.5]);
});
