import assert from 'node:assert/strict';
import { test } from 'node:test';
import { goTo, openPanel, rowOf, status, useBrowser } from './browser.mjs';
import { network, startMachine } from './machine.mjs';

const used = useBrowser();

const CAFE = network(1, 'Café', { 'cafe.example': [21] }, { accepts: [{ eapMethod: 21, password: 'latte' }] });
const LOUNGE = network(2, 'Lounge', { 'lounge.example': [21] });
const HIDDEN = network(3, 'A\u202eB', { 'hidden.example': [13] });
const SEEN = { timeline: [{ atMs: 500, do: 'reportNetworks' }, { atMs: 1000, do: 'reportNetworks' }] };

test('networks are joined and left, and a refusal is told with its reasons', async (t) => {
    const machine = await startMachine(t, { ...SEEN, networks: [CAFE, LOUNGE, HIDDEN] });
    await machine.addUser('Anna', 'cafe.example', 'latte', '--no-auto-connect');
    await machine.addUser('Berta', 'lounge.example', 'wrong', '--no-auto-connect');
    const page = await openPanel(t, used.browser, machine);
    await goTo(page, 'Networks');

    await rowOf(page, 'Café').getByRole('button', { name: 'Join' }).click();
    await rowOf(page, 'Café').getByText('Connected').waitFor();
    await rowOf(page, 'Café').getByText('reached').waitFor();

    await page.getByRole('button', { name: 'Join Lounge' }).click();
    await page.locator('.notice').getByText('Could not join “Lounge” with “Berta”.').waitFor();
    await page.getByRole('button', { name: 'Details of Lounge' }).click();
    for (const step of ['A join was asked for', 'Tries “Berta”', 'Refused', 'No credential is left to try'])
        await page.locator('.timeline li').getByText(step).first().waitFor();

    await rowOf(page, 'Café').getByRole('button', { name: 'Join' }).click();
    await rowOf(page, 'Café').getByRole('button', { name: 'Leave' }).click();
    await rowOf(page, 'Café').getByRole('button', { name: 'Join' }).waitFor();
});

test('a join that nothing fits is refused before the service is asked', async (t) => {
    const machine = await startMachine(t, { ...SEEN, networks: [HIDDEN] });
    const page = await openPanel(t, used.browser, machine);
    await goTo(page, 'Networks');
    await page.getByRole('button', { name: 'Join A\\u202EB' }).click();
    await page.locator('.notice').getByText('it takes hidden.example (EAP-TLS)').waitFor();
    assert.deepEqual(await machine.control.ask({ query: 'calls' }).then((calls) => calls.filter((one) => one.call === 'WlanConnect')), []);
});

test('networks come and go with the air, the radio and the adapter', async (t) => {
    const machine = await startMachine(t, { ...SEEN, networks: [CAFE, LOUNGE] });
    const page = await openPanel(t, used.browser, machine);
    await goTo(page, 'Networks');
    await page.getByText('2 networks').waitFor();
    await page.getByRole('searchbox').fill('cafe.ex');
    await page.getByText('1 of 2 networks').waitFor();
    await page.getByRole('searchbox').fill('');
    const cases = [
        ['hide', { bssid: LOUNGE.bssid }, '1 network', ['Adapter', 'in']],
        ['radio', { software: 'off' }, 'The radio is off.', ['Radio', 'off']],
        ['radio', { software: 'on' }, '1 network', ['Radio', 'on']],
        ['pullAdapter', {}, 'No adapter is in.', ['Adapter', 'out']],
        ['insertAdapter', {}, '1 network', ['Adapter', 'in']],
    ];
    for (const [action, members, shown, told] of cases) {
        await machine.control.do(action, members);
        await machine.control.do('reportNetworks');
        await page.locator('.networks').getByText(shown).waitFor();
        await status(page, ...told);
    }
});
