import assert from 'node:assert/strict';
import { createServer } from 'node:http';
import { test } from 'node:test';
import { openPanel, useBrowser } from './browser.mjs';
import { startMachine } from './machine.mjs';

const used = useBrowser();

/** A stranger's page, on an origin of its own. */
async function startStranger(t) {
    const server = createServer((_, answer) => answer.setHeader('Content-Type', 'text/html').end('<p>stranger</p>'));
    await new Promise((resolve) => server.listen(0, '127.0.0.1', resolve));
    t.after(() => server.close());
    return `http://127.0.0.1:${server.address().port}/`;
}

test('a page of another origin gets nothing, with the user’s cookie in the same browser', async (t) => {
    const machine = await startMachine(t);
    await machine.addUser('Anna', 'cafe.example');
    const page = await openPanel(t, used.browser, machine);
    const origin = new URL(page.url()).origin;
    const stranger = await page.context().newPage();
    await stranger.goto(await startStranger(t));
    const got = await stranger.evaluate(async (origin) => {
        const reading = (mode) =>
            fetch(`${origin}/`, { mode, credentials: 'include' }).then(
                (answer) => answer.text().then((text) => text.length),
                () => 'refused',
            );
        const socket = () =>
            new Promise((resolve) => {
                const one = new WebSocket(`${origin.replace('http', 'ws')}/socket`);
                one.onopen = () => resolve('open');
                one.onerror = () => resolve('refused');
            });
        const loading = (make) =>
            new Promise((resolve) => {
                const element = make();
                element.onload = () => resolve('loaded');
                element.onerror = () => resolve('refused');
                document.body.append(element);
            });
        const script = () => Object.assign(document.createElement('script'), { src: `${origin}/panel.js` });
        return {
            read: await reading('cors'),
            blind: await reading('no-cors'),
            socket: await socket(),
            script: await loading(script),
        };
    }, origin);
    assert.deepEqual(got, { read: 'refused', blind: 'refused', socket: 'refused', script: 'refused' });

    await stranger.evaluate((origin) => {
        const frame = Object.assign(document.createElement('iframe'), { src: `${origin}/` });
        return new Promise((resolve) => ((frame.onload = resolve), document.body.append(frame)));
    }, origin);
    const [, framed] = stranger.frames();
    assert.equal(await framed.locator('#page').count(), 0, 'it cannot be framed');
    await stranger.close();
});
