import assert from 'node:assert/strict';
import { test } from 'node:test';
import { openPanel, useBrowser } from './browser.mjs';
import { startMachine, until } from './machine.mjs';

const used = useBrowser();

const LOUD = { congestion: 95, power: 90, spread: 0 };
const QUIET = { congestion: 4, power: 10, spread: 0 };
const MINUTE = 60_000;
// The time that the waterfall shows, and where it is within the picture.
const LENGTH = 30_000;
const [TOP, BOTTOM] = [154, 6];

/** Where the picture says which channel and what value there is, at a height: pairs of words and place. */
async function readAt(page, y) {
    const canvas = page.getByRole('application', { name: 'Spectrum' });
    const box = await canvas.boundingBox();
    const found = new Map();
    for (let x = 60; x < box.width - 10; x += box.width / 12) {
        await page.mouse.move(box.x + x, box.y + y);
        await page.evaluate(() => new Promise((resolve) => requestAnimationFrame(() => requestAnimationFrame(resolve))));
        const words = await page.locator('.readout').innerText();
        const [, channel, congestion] = /Channel (\d+), .* congestion (\d+)\s%/.exec(words) ?? [];
        if (channel) found.set(Number(channel), { x, congestion: Number(congestion) });
    }
    await page.mouse.move(0, 0);
    return found;
}

/** How light the picture is at a place, 0 to 255. */
const lightnessAt = (page, x, y) =>
    page.getByRole('application', { name: 'Spectrum' }).evaluate(
        (canvas, [x, y]) => {
            const [r, g, b] = canvas.getContext('2d').getImageData(x * devicePixelRatio, y * devicePixelRatio, 1, 1).data;
            return (r + g + b) / 3;
        },
        [x, y],
    );

test('two minutes of spectrum are in the waterfall, each channel and time in its place', async (t) => {
    const levels = { 6: LOUD, 36: QUIET };
    const machine = await startMachine(t, { speed: 40, spectrum: { channels: [6, 36], levels } });
    const page = await openPanel(t, used.browser, machine);
    await page.getByRole('button', { name: '30 s' }).click();
    await page.getByRole('button', { name: 'Start scan' }).click();
    await page.getByText('Scanning.', { exact: true }).waitFor();
    // The machine lives faster than the page, whose waterfall shows the time on the wall.
    const time = async () => (await machine.control.ask({ query: 'time' })).ms;
    const [start, begin] = [await time(), Date.now()];
    await until(async () => (await time()) - start > MINUTE, 'the first minute');
    await machine.control.do('levels', { levels: { 6: QUIET, 36: LOUD } });
    const change = Date.now();
    await until(async () => (await time()) - start > 2 * MINUTE, 'the second minute');
    const second = Date.now() - change;
    await page.getByRole('button', { name: 'Pause' }).click();
    const end = Date.now();

    const { height } = await page.getByRole('application', { name: 'Spectrum' }).boundingBox();
    const row = (moment) => TOP + ((height - TOP - BOTTOM) * (end - moment)) / LENGTH;
    const cases = [
        ['newest', row(change + second * 0.7), 36, 6],
        ['before the change', row((begin + change) / 2), 6, 36],
    ];
    for (const [name, y, loud, quiet] of cases) {
        const found = await readAt(page, y);
        assert.deepEqual([...found.keys()].sort((a, b) => a - b), [6, 36], name);
        assert.ok(found.get(loud).congestion > 80, `${name}: ${found.get(loud).congestion} % is loud`);
        assert.ok(found.get(quiet).congestion < 20, `${name}: ${found.get(quiet).congestion} % is quiet`);
        const light = await lightnessAt(page, found.get(loud).x, y);
        const dark = await lightnessAt(page, found.get(quiet).x, y);
        assert.ok(light > dark + 80, `${name}: lightness ${light} of the loud, ${dark} of the quiet one`);
    }
    const oldest = await readAt(page, height - 10);
    assert.equal(oldest.size, 0, 'nothing was known before the scan');
});
