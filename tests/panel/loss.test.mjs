import { test } from 'node:test';
import { goTo, openPanel, rowOf, status, useBrowser } from './browser.mjs';
import { network, startMachine } from './machine.mjs';

const used = useBrowser();

test('a service that is killed is told at once, and comes back by itself', async (t) => {
    const seen = [{ atMs: 500, do: 'reportNetworks' }, { atMs: 1000, do: 'reportNetworks' }];
    const machine = await startMachine(t, { networks: [network(1, 'Café', { 'cafe.example': [21] })], timeline: seen });
    await machine.addUser('Anna', 'other.example');
    const page = await openPanel(t, used.browser, machine);
    await goTo(page, 'Credentials');
    await rowOf(page, 'Anna').waitFor();
    await machine.kill();
    await status(page, 'Service', 'lost, looking for it');
    await page.getByText('The service has not told its credentials yet.').waitFor();
    await page.locator('button:disabled', { hasText: 'Add' }).waitFor();
    await machine.startAgain();
    await rowOf(page, 'Anna').waitFor();
    await goTo(page, 'Networks');
    await rowOf(page, 'Café').waitFor();
});
