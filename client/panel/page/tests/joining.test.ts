import assert from 'node:assert/strict';
import { test } from 'node:test';
import { Checkpoint } from '../src/app/checkpoint';
import { readEvent } from '../src/app/protocol';
import { afterEvent, INITIAL_STATE } from '../src/app/state';
import { JoinJudge, LeaveJudge, type Outcome } from '../src/networks/joining';

type Told = [id: string, data?: unknown, at?: number];

const list = (connected: string | null, names = ['Café', 'Gate'], at = 0): Told => [
    'GET_ALL_NETWORK_LIST',
    names.map((name) => ({ NetWorkName: name, IsConnected: name === connected })),
    at,
];
const PASSED: Told[] = [['CARD_PLUG_IN']];
const result = (value: number): Told => ['CONNECT_DISCONNECT', value];
const REPORT: Told = ['GET_IS_INTERNET_ACCESS', false];

function outcomeOf(Kind: typeof JoinJudge | typeof LeaveJudge, events: Told[]): Outcome {
    const judge = new Kind('Café', new Checkpoint(() => {}, 1), () => {});
    let state = INITIAL_STATE;
    let outcome: Outcome = 'open';
    for (const [EventId, data, at] of events) {
        const event = readEvent('hotspot', { EventId, Data: data === undefined ? '' : JSON.stringify(data) }, at ?? 0)!;
        state = afterEvent(state, event);
        outcome = judge.take(event, state.networks ?? []);
    }
    return outcome;
}

test('a join is what the list and the results behind the request say', () => {
    const cases: [string, Told[], Outcome][] = [
        ['told and listed', [...PASSED, result(1), REPORT, list('Café')], 'joined'],
        ['told, not listed: the system’s own attempt', [...PASSED, result(1), REPORT, list(null)], 'open'],
        ['listed for a moment only', [...PASSED, list('Café', undefined, 0), list('Café', undefined, 500)], 'open'],
        ['listed for long', [...PASSED, list('Café', undefined, 0), list('Café', undefined, 1000)], 'joined'],
        ['refused', [...PASSED, result(0), REPORT, list(null)], 'refused'],
        ['the failure of an attempt before', [result(0), REPORT, ...PASSED, list(null)], 'open'],
        ['could not begin', [result(0), ...PASSED, list(null)], 'notStarted'],
        ['somebody else could not begin', [...PASSED, result(0), list(null)], 'open'],
        ['out of range when asked for', [...PASSED, result(0), list(null, ['Gate'])], 'outOfRange'],
        ['gone for long', [...PASSED, list(null, ['Gate'], 0), list(null, ['Gate'], 950)], 'outOfRange'],
        [
            'another one was joined',
            [...PASSED, result(1), REPORT, list('Gate', undefined, 0), list('Gate', undefined, 950)],
            'overtaken',
        ],
        ['radio', [['GET_RADIO', false]], 'radioOff'],
        ['adapter', [['CARD_PLUG_OUT']], 'adapterOut'],
    ];
    for (const [name, events, expected] of cases) assert.equal(outcomeOf(JoinJudge, events), expected, name);
});

test('a network is left when the list says so', () => {
    const cases: [Told[], Outcome][] = [
        [[list('Café')], 'open'],
        [[list('Café'), list(null)], 'left'],
        [[list(null, ['Gate'])], 'left'],
    ];
    for (const [events, expected] of cases) assert.equal(outcomeOf(LeaveJudge, events), expected);
});
