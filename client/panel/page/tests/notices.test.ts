import assert from 'node:assert/strict';
import { test } from 'node:test';
import { notices, notify } from '../src/app/notices';

test('the oldest of many notices goes, but none whose undo somebody may still want', () => {
    const expired: string[] = [];
    const tell = (text: string, action?: { label: string; run(): void }) =>
        notify(text, { action, onExpired: () => expired.push(text) });
    const undo = { label: 'Undo', run() {} };
    const takeBack = tell('a', undo);
    for (const text of ['b', 'c', 'd', 'e']) tell(text);
    assert.deepEqual(expired, ['b']);
    for (const text of ['f', 'g', 'h', 'i', 'j']) tell(text, undo);
    assert.deepEqual(expired, ['b', 'c', 'd', 'e']);
    assert.deepEqual(notices.get().map((notice) => notice.text), ['a', 'f', 'g', 'h', 'i', 'j']);
    tell('news');
    assert.equal(notices.get().at(-1)?.text, 'news');
    takeBack();
    assert.deepEqual(expired.slice(4), ['a']);
});
