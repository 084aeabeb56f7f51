import assert from 'node:assert/strict';
import { test } from 'node:test';
import { goTo, openPanel, rowOf, status, useBrowser } from './browser.mjs';
import { network, startMachine, until } from './machine.mjs';

const used = useBrowser();

const CAFE = network(1, 'Café', { 'cafe.example': [21] }, { accepts: [{ eapMethod: 21, username: 'anna', password: 'latte' }] });
const SEEN = { timeline: [{ atMs: 500, do: 'reportNetworks' }, { atMs: 1000, do: 'reportNetworks' }] };

const order = (machine, expected) =>
    until(async () => JSON.stringify(await machine.orderInFile()) === JSON.stringify(expected), `order ${expected} in the file`);

async function drag(page, from, to) {
    const handles = page.locator('.handle');
    const [start, end] = [await handles.nth(from).boundingBox(), await handles.nth(to).boundingBox()];
    await page.mouse.move(start.x + 8, start.y + 8);
    await page.mouse.down();
    await page.mouse.move(start.x + 8, (start.y + end.y) / 2);
    await page.mouse.move(start.x + 8, end.y + (to > from ? end.height : 0));
    await page.mouse.up();
}

test('a credential that is added is used at once, and edited without its password being known', async (t) => {
    const machine = await startMachine(t, { ...SEEN, networks: [CAFE] });
    const page = await openPanel(t, used.browser, machine);
    await goTo(page, 'Credentials');
    await page.getByRole('button', { name: 'Add' }).click();
    const dialog = page.getByRole('dialog');
    await dialog.getByRole('button', { name: 'Add' }).click();
    await dialog.getByText('Realm is needed').waitFor();
    await dialog.getByLabel('Realm').fill('cafe.example');
    await dialog.getByLabel('Name', { exact: true }).fill('Coffee');
    await dialog.getByLabel('User name', { exact: true }).fill('anna');
    await dialog.getByRole('textbox', { name: 'Password' }).fill('latte');
    await dialog.getByRole('button', { name: 'Add' }).click();
    await dialog.waitFor({ state: 'detached' });
    await rowOf(page, 'Coffee').getByText('“Café”').waitFor();
    await goTo(page, 'Networks');
    await rowOf(page, 'Café').getByText('Connected').waitFor();

    await goTo(page, 'Credentials');
    await page.getByRole('button', { name: 'Edit “Coffee”' }).click();
    await dialog.getByLabel('Name', { exact: true }).fill('Espresso');
    await dialog.getByRole('button', { name: 'Save' }).click();
    await rowOf(page, 'Espresso').waitFor();
    const [stored] = JSON.parse(await machine.vexa(['credentials', '--json', '--show-passwords']));
    assert.deepEqual([stored.name, stored.password, stored.username], ['Espresso', 'latte', 'anna']);
});

test('rows are moved by the pointer and by keys, and the file has their order', async (t) => {
    const machine = await startMachine(t);
    for (const name of ['A', 'B', 'C', 'D']) await machine.addUser(name, `${name}.example`);
    await order(machine, [4, 3, 2, 1]);
    const page = await openPanel(t, used.browser, machine);
    await goTo(page, 'Credentials');
    await page.getByText('4 credentials').waitFor();

    await drag(page, 0, 2);
    await order(machine, [3, 2, 4, 1]);
    await drag(page, 3, 0);
    await order(machine, [1, 3, 2, 4]);
    await drag(page, 1, 1);

    await page.locator('.handle').nth(2).focus();
    for (const key of ['Space', 'ArrowUp', 'ArrowUp', 'Escape']) await page.keyboard.press(key);
    for (const key of ['Space', 'ArrowUp', 'Space']) await page.keyboard.press(key);
    await order(machine, [1, 2, 3, 4]);
    await page.getByText('“B” is in position 2 now.').waitFor({ state: 'attached' });
    assert.match(await page.evaluate(() => document.activeElement.ariaLabel), /“B”, position 2 of 4/);
});

test('what is deleted can be had back until the page is left', async (t) => {
    const machine = await startMachine(t);
    for (const name of ['A', 'B', 'C']) await machine.addUser(name, `${name}.example`);
    const page = await openPanel(t, used.browser, machine);
    await goTo(page, 'Credentials');
    await page.getByRole('button', { name: 'Delete “B”' }).click();
    await page.getByText('2 credentials').waitFor();
    await page.locator('.handle').first().focus();
    for (const key of ['Space', 'ArrowDown', 'Space']) await page.keyboard.press(key);
    await page.getByRole('button', { name: 'Undo' }).click();
    await order(machine, [2, 1, 3]);
    assert.deepEqual(await page.locator('.credential .name').allInnerTexts(), ['B', 'A', 'C']);

    await page.getByRole('button', { name: 'Delete “A”' }).click();
    await page.getByText('2 credentials').waitFor();
    assert.deepEqual(await machine.orderInFile(), [2, 1, 3]);
    await page.close();
    await order(machine, [2, 3]);
});

test('the switch turns the hotspot function, and a changed file is read again', async (t) => {
    const machine = await startMachine(t, { ...SEEN, networks: [CAFE] });
    const page = await openPanel(t, used.browser, machine);
    await goTo(page, 'Credentials');
    await page.getByRole('button', { name: 'Off' }).click();
    await page.locator('button[aria-pressed="true"]', { hasText: 'Off' }).waitFor();
    await status(page, 'Hotspot', 'off');
    assert.match(await machine.vexa(['networks']), /No hotspot networks/);
    await until(async () => /Hotspot +disabled/.test(await machine.vexa(['status'])), 'the switch, written down');
    await page.getByRole('button', { name: 'On' }).click();
    await page.locator('button[aria-pressed="true"]', { hasText: 'On' }).waitFor();
    await page.getByRole('button', { name: 'Reload' }).click();
    await page.getByText('Read again: 0 credentials. Nothing has changed.').waitFor();
});
