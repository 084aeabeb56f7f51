import assert from 'node:assert/strict';
import { createServer } from 'node:http';
import { test } from 'node:test';
import { openPanel, useBrowser } from './browser.mjs';
import { startMachine, startPanel } from './machine.mjs';

const used = useBrowser('--host-resolver-rules=MAP evil.example 127.0.0.1');

/** A stranger's page, on an origin of its own. */
async function startStranger(t) {
    const server = createServer((_, answer) => answer.setHeader('Content-Type', 'text/html').end('<p>stranger</p>'));
    await new Promise((resolve) => server.listen(0, '127.0.0.1', resolve));
    t.after(() => server.close());
    return `http://127.0.0.1:${server.address().port}/`;
}

test('the door opens once, to the right token and name', async (t) => {
    const machine = await startMachine(t);
    const address = await startPanel(t, machine);
    const { port, searchParams } = new URL(address);
    const token = searchParams.get('token');
    const refused = [
        `http://127.0.0.1:${port}/`,
        `http://127.0.0.1:${port}/panel.js`,
        `http://127.0.0.1:${port}/?token=${token.replace(/^./, (first) => (first === 'a' ? 'b' : 'a'))}`,
        `http://evil.example:${port}/?token=${token}`,
        `http://localhost:${port}/?token=${token}`,
    ];
    const page = await used.browser.newPage();
    t.after(() => page.close());
    for (const url of refused) {
        const answer = await page.goto(url);
        assert.ok([403, 404].includes(answer.status()), `${url}: ${answer.status()}`);
        assert.deepEqual(await page.context().cookies(), [], url);
    }
    assert.equal((await page.goto(address)).status(), 200);
    assert.ok(!page.url().includes('token'), page.url());
    const [cookie] = await page.context().cookies();
    assert.deepEqual([cookie.name, cookie.httpOnly, cookie.sameSite], [`vexa-panel-${port}`, true, 'Strict']);
    const second = await used.browser.newPage();
    t.after(() => second.close());
    assert.equal((await second.goto(address)).status(), 403);
});

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
