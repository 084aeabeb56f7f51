import assert from 'node:assert/strict';
import { test } from 'node:test';
import type { Credential, Network } from '../src/app/state';
import { EMPTY } from '../src/credentials/form';
import { fittingCredentials, networksByCredential, realmBytes, whyNeverTaken } from '../src/credentials/matching';

const network = (name: string, ...realms: [string, number][]): Network => ({
    name,
    type: 2,
    isConnected: false,
    hasInternet: true,
    realmsKnown: true,
    realms: realms.map(([realm, method]) => ({ name: realm, method })),
});
const user = (Id: number, RealName: string, more: Partial<Credential> = {}): Credential => ({
    ...EMPTY,
    ...{ Id, RealName, CredentialName: `C${Id}`, Username: 'anna', Password: '********' },
    ...more,
});
const certificate = (Id: number, RealName: string) =>
    user(Id, RealName, { Type: 3, CredentialEapMethod: 1, Username: '', Password: '', ClientCert: 'anna@corp' });

test('a credential fits by realm and method, letter for letter', () => {
    const cafe: [string, number] = ['cafe.example', 2];
    const cases: [string, Credential, [string, number], boolean][] = [
        ['same realm and method', user(1, 'cafe.example'), cafe, true],
        ['another realm', user(1, 'cafe.examples'), cafe, false],
        ['case counts', user(1, 'Cafe.example'), cafe, false],
        ['another method', certificate(1, 'cafe.example'), cafe, false],
        ['a certificate', certificate(1, 'corp.example'), ['corp.example', 1], true],
        ['without a password', user(1, 'cafe.example', { Password: '' }), cafe, false],
        ['without a user name', user(1, 'cafe.example', { Username: '' }), cafe, false],
        ['an empty realm fits none that is empty', user(1, ''), ['', 2], false],
        ['beyond Latin-1', user(1, '機場.example'), ['機場.example', 2], false],
        ['Latin-1 goes as a byte, the network tells UTF-8', user(1, 'café.example'), ['café.example', 2], false],
        ['the very bytes', user(1, 'cafÃ©.example'), ['café.example', 2], true],
        ['longer than is compared', user(1, 'a'.repeat(256)), ['a'.repeat(256), 2], false],
    ];
    for (const [name, credential, realm, expected] of cases) {
        const air = network('N', ['other.example', 2], realm);
        assert.deepEqual(fittingCredentials([credential], air), expected ? [credential] : [], name);
        assert.equal(networksByCredential([credential], [air]).has(1), expected, `${name}, asked the other way`);
    }
});

test('each credential is told all networks in range that take it, once each', () => {
    const air = [
        network('A', ['a.example', 2], ['a.example', 2]),
        network('B', ['b.example', 2]),
        network('C', ['a.example', 2], ['b.example', 1]),
    ];
    const taking = networksByCredential([user(1, 'a.example'), user(2, 'b.example'), user(3, 'c.example')], air);
    const names = [...taking].map(([id, networks]) => [id, networks.map((one) => one.name).join('')]);
    assert.deepEqual(names, [[1, 'AC'], [2, 'B']]);
    assert.deepEqual(
        fittingCredentials([user(2, 'b.example'), certificate(4, 'b.example'), user(1, 'a.example')], air[2]).map((c) => c.Id),
        [4, 1],
    );
});

test('what no network at all would take says why', () => {
    assert.equal(realmBytes('é'), 'é');
    const cases: [Credential, RegExp | null][] = [
        [user(1, 'a.example'), null],
        [user(1, ''), /no realm/],
        [user(1, '機'), /characters/],
        [user(1, 'a.example', { Password: '' }), /password is missing/],
        [user(1, 'a.example', { Type: 7, CredentialEapMethod: 5 }), /method/],
    ];
    for (const [credential, expected] of cases) {
        const why = whyNeverTaken(credential);
        if (expected) assert.match(why ?? '', expected);
        else assert.equal(why, null);
    }
});
