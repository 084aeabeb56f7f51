import assert from 'node:assert/strict';
import { mkdir } from 'node:fs/promises';
import { join } from 'node:path';
import { test } from 'node:test';
import axe from 'axe-core';
import { goTo, openPanel, rowOf, useBrowser } from './browser.mjs';
import { network, startMachine } from './machine.mjs';

const used = useBrowser();

const TABS = ['Spectrum', 'Networks', 'Credentials', 'Record'];
const SIZES = [[360, 740], [1280, 800], [2560, 1440]];
const CHANNELS = [1, 6, 11, 36, 40, 44, 48, 52, 56, 60, 64, 100, 104, 108, 112, 149, 153, 157, 161];

const WORLD = {
    networks: [
        network(1, 'Gate 12', { 'corp.example': [13] }, { accepts: [{ eapMethod: 13, authMode: 'machine' }] }),
        network(2, 'Departures', { 'lounge.example': [21], 'corp.example': [13] }),
        network(3, 'City Free', {}, { internetAccess: 0 }),
        network(4, 'Roaming', Object.fromEntries([1, 2, 3, 4].map((i) => [`operator${i}.example`, [21, 13]]))),
    ],
    spectrum: {
        channels: CHANNELS,
        levels: Object.fromEntries(
            CHANNELS.map((channel, i) => [channel, { congestion: (i * 37) % 80, power: 20 + ((i * 53) % 60), spread: 8 }]),
        ),
    },
    timeline: [{ atMs: 500, do: 'reportNetworks' }, { atMs: 1000, do: 'reportNetworks' }],
};

async function startWorld(t) {
    const machine = await startMachine(t, WORLD);
    await machine.addUser('Airport Lounge', 'lounge.example', 'wrong', '--no-auto-connect');
    await machine.vexa('credential add --name Work --realm corp.example --method tls --client-cert anna@corp'.split(' '));
    return machine;
}

async function violations(page) {
    await page.evaluate(axe.source);
    const { violations: found } = await page.evaluate(() => window.axe.run());
    return found.map(({ id, nodes }) => `${id}: ${nodes.map((node) => node.html.slice(0, 120)).join(' | ')}`);
}

test('each view is accessible in both themes, and looks right at three sizes', async (t) => {
    const machine = await startWorld(t);
    const folder = join(process.env.VEXA_BUILD ?? 'build/release', 'panel-screenshots');
    await mkdir(folder, { recursive: true });
    const page = await openPanel(t, used.browser, machine, { reducedMotion: 'reduce' });
    await page.getByRole('button', { name: 'Start scan' }).click();
    await goTo(page, 'Networks');
    await rowOf(page, 'Gate 12').getByText('Connected').waitFor();
    for (const tab of TABS) {
        await goTo(page, tab);
        if (tab === 'Credentials') {
            await page.getByRole('button', { name: 'Add' }).click();
            assert.deepEqual(await violations(page), [], 'the dialog');
            await page.keyboard.press('Escape');
        }
        if (tab === 'Networks') await page.getByRole('button', { name: 'Details of Departures' }).click();
        for (const colorScheme of ['light', 'dark']) {
            await page.emulateMedia({ colorScheme });
            assert.deepEqual(await violations(page), [], `${tab}, ${colorScheme}`);
            for (const [width, height] of SIZES) {
                await page.setViewportSize({ width, height });
                const name = `${tab.toLowerCase()}-${colorScheme}-${width}.png`;
                await page.screenshot({ path: join(folder, name) });
                const overflow = await page.evaluate(() => document.documentElement.scrollWidth - innerWidth);
                assert.ok(overflow <= 0, `${name}: ${overflow} px too wide`);
            }
        }
    }
});

test('all can be done by the keyboard alone', async (t) => {
    const page = await openPanel(t, used.browser, await startWorld(t));
    const press = async (...keys) => {
        for (const key of keys) await page.keyboard.press(key);
    };
    const tabTo = async (name) => {
        for (let i = 0; i < 60; i++) {
            await press('Tab');
            const label = await page.evaluate(() => {
                const { ariaLabel, textContent, labels } = document.activeElement;
                return ariaLabel || labels?.[0]?.textContent || textContent;
            });
            if (label === name) return;
        }
        assert.fail(`no way to ${name} by Tab`);
    };
    await tabTo('Spectrum');
    await press('ArrowRight', 'ArrowRight');
    await tabTo('Add');
    await press('Enter');
    const dialog = page.getByRole('dialog');
    await dialog.waitFor();
    await tabTo('Realm');
    await page.keyboard.type('keys.example');
    await tabTo('User name');
    await page.keyboard.type('anna');
    await tabTo('Password');
    await page.keyboard.type('secret');
    await press('Enter');
    await dialog.waitFor({ state: 'detached' });
    await rowOf(page, 'keys.example').waitFor();
    assert.equal(await page.evaluate(() => document.activeElement.textContent), 'Add', 'the focus is back');

    await tabTo('Move “keys.example”, position 1 of 3');
    await press('Space', 'End', 'Space');
    await tabTo('Delete “keys.example”');
    await press('Enter');
    await rowOf(page, 'keys.example').waitFor({ state: 'detached' });
    await tabTo('Undo');
    await press('Enter');
    await rowOf(page, 'keys.example').waitFor();

    await page.getByRole('tab', { name: 'Credentials' }).focus();
    await press('ArrowLeft');
    await tabTo('Join Departures');
    await press('Enter');
    await page.locator('.notice').getByText('Could not join “Departures”').waitFor();
});
