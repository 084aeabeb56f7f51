import assert from 'node:assert/strict';
import { test } from 'node:test';
import { readEvent } from '../src/app/protocol';
import { Service } from '../src/app/service';
import type { Credential } from '../src/app/state';
import { addition, carryOut, deletion, edit, move, type Change } from '../src/credentials/changes';
import { EMPTY, formOf, objectionsTo, wantedOf, type Field } from '../src/credentials/form';
import { gapAt, moved, placeInGap, positionData } from '../src/credentials/order';

const user = (Id: number, more: Partial<Credential> = {}): Credential => ({
    ...EMPTY,
    ...{ Id, RealName: `r${Id}.example`, CredentialName: `C${Id}`, Username: 'anna', Password: '********' },
    ...more,
});

test('a move names the place in the whole list, of which less may be shown', () => {
    const all = [10, 20, 30, 40, 50];
    const cases: [name: string, shown: number[], from: number, to: number, order: number][] = [
        ['down by one', all, 0, 1, 1],
        ['up by one', all, 3, 2, 2],
        ['to the top', all, 4, 0, 0],
        ['to the end', all, 0, 4, 4],
        ['behind a hidden one', [10, 30, 40, 50], 0, 1, 2],
        ['in front of a hidden one at the end', [10, 20, 30, 40], 0, 3, 4],
        ['nowhere', all, 2, 2, 2],
    ];
    for (const [name, shown, from, to, order] of cases) {
        const id = shown[from];
        assert.deepEqual(positionData(all, moved(shown, from, to), id), { Id: id, Order: order }, name);
        const result = moved(all, all.indexOf(id), order).filter((one) => shown.includes(one));
        assert.deepEqual(result, moved(shown, from, to), `${name}: what the service makes of it`);
    }
});

test('a dragged row falls where the pointer is', () => {
    const middles = [10, 30, 50];
    const cases: [y: number, from: number, place: number][] = [[0, 0, 0], [25, 0, 0], [35, 0, 1], [99, 0, 2], [0, 2, 0], [15, 2, 1], [45, 2, 2]];
    for (const [y, from, place] of cases) assert.equal(placeInGap(from, gapAt(middles, y)), place, `${y} from ${from}`);
});

test('the form refuses what the service would refuse, cut, or store for nothing', () => {
    const all = [user(1), user(2, { Type: 3, CredentialEapMethod: 1, ClientCert: 'a' })];
    const fine = { ...EMPTY, RealName: 'new.example', Username: 'u', Password: 'p' };
    const cases: [string, Credential, Credential | null, Field[]][] = [
        ['fine', fine, null, []],
        ['nothing', EMPTY, null, ['RealName', 'Username', 'Password']],
        ['a certificate needs no more than a realm', { ...EMPTY, Type: 3, RealName: 'x' }, null, []],
        ['127 units of a realm', { ...fine, RealName: 'é'.repeat(127) }, null, []],
        ['a realm that no network can announce', { ...fine, RealName: '機' }, null, ['RealName']],
        ['128 units', { ...fine, RealName: 'a'.repeat(128), CredentialName: 'n' }, null, ['RealName']],
        ['units are counted, not characters', { ...fine, Username: '😀'.repeat(32) }, null, ['Username']],
        ['a long password', { ...fine, Password: 'a'.repeat(64) }, null, ['Password']],
        ['a control character', { ...fine, CredentialName: 'a\u0007b' }, null, ['CredentialName']],
        ['half a character', { ...fine, CredentialName: '\ud800' }, null, ['CredentialName']],
        ['the mask as a password', { ...fine, Password: '********' }, null, ['Password']],
        ['a taken realm and type', { ...fine, RealName: 'r1.example' }, null, ['RealName']],
        ['the realm of another type', { ...fine, RealName: 'r2.example' }, null, []],
        ['a taken name', { ...fine, CredentialName: 'C2' }, null, ['CredentialName']],
        ['an edit may leave the password', formOf(all[0]), all[0], []],
        ['there is none to leave', formOf(user(1, { Password: '' })), user(1, { Password: '' }), ['Password']],
        ['an edit may not take a name', { ...formOf(all[0]), CredentialName: 'C2' }, all[0], ['CredentialName']],
    ];
    for (const [name, form, before, fields] of cases)
        assert.deepEqual(Object.keys(objectionsTo(form, all, before)).sort(), [...fields].sort(), name);
    assert.equal(wantedOf(formOf(all[0]), all[0]).Password, '********');
    assert.equal(wantedOf({ ...fine, RealName: ' x.example ' }, null).CredentialName, 'x.example');
});

// A service that answers each change with this list, and somebody else's list before it.
async function answered(change: Change, before: Credential[], after: Credential[]) {
    const sent: { message: { CommandId: string } }[] = [];
    const service = new Service((_, message) => void sent.push({ message: message as { CommandId: string } }));
    const tell = (id: string, data?: unknown) =>
        service.takeEvent(readEvent('hotspot', { EventId: id, Data: data === undefined ? '' : JSON.stringify(data) }, 0)!);
    service.takeLink('open');
    service.takePanelMessage({ event: 'service', running: true });
    tell('GET_ALL_CREDENTIAL_LIST', before);
    const result = carryOut(service, change);
    tell('GET_ALL_CREDENTIAL_LIST', before);
    tell('GET_ALL_CREDENTIAL_LIST', after);
    tell('CARD_PLUG_IN');
    tell('CARD_PLUG_IN');
    const commands = sent.map(({ message }) => message.CommandId);
    assert.deepEqual(commands, [change.command, 'GET_IS_CARD_IN', 'GET_IS_CARD_IN'].slice(0, commands.length));
    return result;
}

test('what a change came to is read from the list that answers', async () => {
    const all = [user(1), user(2)];
    const wanted = user(0, { RealName: 'new.example', CredentialName: 'New', Password: 'secret' });
    const stored = user(3, { ...wanted, Id: 3, Creator: 'PC\\anna', Password: '********' });
    const cases: [string, Change, Credential[], RegExp | null][] = [
        ['added', addition(wanted, all), [stored, ...all], null],
        ['not added', addition(wanted, all), all, /“New” was not stored: the service refused/],
        ['realm taken', addition({ ...wanted, RealName: 'r1.example' }, all), all, /realm .* “C1”/],
        ['edited', edit(user(1, { Username: 'berta' })), [user(1, { Username: 'berta' }), all[1]], null],
        ['not edited', edit(user(1, { Username: 'berta' })), all, /“C1” was not changed: the service/],
        ['edited, but gone', edit(user(1, { Username: 'berta' })), [all[1]], /not there any more/],
        ['deleted', deletion(all[0]), [all[1]], null],
        ['not deleted', deletion(all[0]), all, /“C1” was not deleted/],
        ['moved', move(all[0], 1), [all[1], all[0]], null],
        ['moved beyond the end', move(all[0], 9), [all[1], all[0]], null],
        ['not moved', move(all[0], 1), all, /it is in position 1/],
    ];
    for (const [name, change, after, expected] of cases) {
        const result = await answered(change, all, after);
        if (expected) assert.match(result.isDone ? 'done' : result.why, expected, name);
        else assert.deepEqual(result, { isDone: true }, name);
    }
});

test('a change of a service that is away, or goes on the way, is not known to be made', async () => {
    const service = new Service(() => {});
    const change = deletion(user(1));
    assert.match(String(Object.values(await carryOut(service, change))), /lost/);
    service.takeLink('open');
    service.takePanelMessage({ event: 'service', running: true });
    const result = carryOut(service, change);
    service.takePanelMessage({ event: 'service', running: false });
    assert.match(String(Object.values(await result)), /lost/);
});
