// A browser with the panel's page.
import assert from 'node:assert/strict';
import { after, before } from 'node:test';
import { chromium } from 'playwright-core';
import { startPanel } from './machine.mjs';

const EXECUTABLE = process.env.VEXA_CHROMIUM ?? '/usr/bin/chromium';

/** One browser for the tests of a file; in a container its sandbox can't be made. */
export function useBrowser() {
    const used = {};
    before(async () => {
        const args = process.getuid() === 0 ? ['--no-sandbox'] : [];
        used.browser = await chromium.launch({ executablePath: EXECUTABLE, args });
    });
    after(() => used.browser.close());
    return used;
}

/** A page on the panel of the machine, closed before it. What goes wrong in it fails the test. */
export async function openPanel(t, browser, machine, options = {}) {
    const context = await browser.newContext({ viewport: { width: 1280, height: 800 }, ...options });
    const page = await context.newPage();
    const faults = [];
    page.on('pageerror', (error) => faults.push(error.message));
    page.on('console', (message) => message.type() === 'error' && faults.push(message.text()));
    t.after(async () => {
        await context.close();
        assert.deepEqual(faults, []);
    });
    page.setDefaultTimeout(15_000);
    await page.goto(await startPanel(t, machine));
    await status(page, 'Adapter', 'in');
    return page;
}

/** Waits until the status line says so. */
export async function status(page, label, value) {
    const item = page.locator('.status-item').filter({ has: page.locator('dt', { hasText: label }) });
    await item.locator('dd').getByText(value, { exact: true }).waitFor();
}

export async function goTo(page, tab) {
    await page.getByRole('tab', { name: tab }).click();
}

/** The row of a table that has this text. */
export function rowOf(page, text) {
    return page.getByRole('row').filter({ hasText: text });
}
