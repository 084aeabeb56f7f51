import assert from 'node:assert/strict';
import { test } from 'node:test';
import { readEvent, type ServicePort } from '../src/app/protocol';
import { afterEvent, afterLink, afterPanelMessage, INITIAL_STATE, LOG_LINES, type State } from '../src/app/state';

const told = (events: [ServicePort, string, unknown?][], from: State = INITIAL_STATE) =>
    events.reduce((state, [port, EventId, data]) => {
        const event = readEvent(port, { EventId, Data: data === undefined ? undefined : JSON.stringify(data) }, 0);
        return afterEvent(state, event!);
    }, from);

const NETWORK = { NetWorkName: 'Library', NetworkType: 2, IsConnected: false, IsInternetAccess: 2, RealmFetched: true };

test('each event tells its part of the state', () => {
    const cases: [string, [ServicePort, string, unknown?][], Partial<State>][] = [
        ['an adapter comes', [['hotspot', 'CARD_PLUG_IN', '']], { adapter: true }],
        [
            'an adapter goes, and its networks with it',
            [
                ['hotspot', 'GET_ALL_NETWORK_LIST', [NETWORK]],
                ['spectral', 'CARD_PLUG_OUT'],
            ],
            { adapter: false, networks: [], currentChannel: 0 },
        ],
        [
            'the radio, by either port',
            [
                ['spectral', 'RADIO_OFF'],
                ['hotspot', 'GET_RADIO', true],
            ],
            { radio: true },
        ],
        ['a list tells that the hotspot switch is on', [['hotspot', 'GET_ALL_NETWORK_LIST', []]], { hotspot: true }],
        [
            'no list leaves the switch as it was told',
            [
                ['hotspot', 'SET_HOTSPOT_AUTO_CONNECT', false],
                ['hotspot', 'GET_ALL_NETWORK_LIST', null],
            ],
            { hotspot: false, networks: [] },
        ],
        ['unreadable data change nothing', [['hotspot', 'GET_ALL_NETWORK_LIST']], { networks: null }],
        ['the current channel', [['spectral', 'SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA', 36]], { currentChannel: 36 }],
        [
            'channels by number',
            [
                [
                    'spectral',
                    'SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G',
                    [
                        { Channel: 36, Order: 1 },
                        { Channel: 1, Order: 2 },
                    ],
                ],
            ],
            {
                channels: [
                    { number: 1, order: 2 },
                    { number: 36, order: 1 },
                ],
            },
        ],
    ];
    for (const [name, events, expected] of cases) {
        const state = told(events);
        for (const [member, value] of Object.entries(expected))
            assert.deepEqual(state[member as keyof State], value, `${name}: ${member}`);
    }
});

test('the internet of a network is told in other numbers once it is connected', () => {
    const cases: [boolean, number, boolean][] = [
        [false, 2, true],
        [false, 0, false],
        [true, 0, true],
        [true, 1, false],
    ];
    for (const [IsConnected, IsInternetAccess, expected] of cases) {
        const state = told([['hotspot', 'GET_ALL_NETWORK_LIST', [{ ...NETWORK, IsConnected, IsInternetAccess }]]]);
        assert.equal(state.networks![0].hasInternet, expected, `${IsConnected} ${IsInternetAccess}`);
    }
});

test('a service that is lost takes what it told along, and the log begins anew with a link', () => {
    let state = told([['hotspot', 'CARD_PLUG_IN', '']]);
    state = afterPanelMessage(state, { event: 'log', on: true, lines: Array(LOG_LINES).fill('old') });
    state = afterPanelMessage(state, { event: 'log', on: true, lines: ['new'] });
    assert.equal(state.log.lines.length, LOG_LINES);
    assert.equal(state.log.lines.at(-1), 'new');
    state = afterPanelMessage(state, { event: 'service', running: true, hotspot: false });
    assert.equal(state.hotspot, false);
    state = afterPanelMessage(state, { event: 'service', running: true });
    assert.equal(state.hotspot, false);
    state = afterPanelMessage(state, { event: 'service', running: false });
    assert.deepEqual([state.adapter, state.running, state.log.lines.length], [null, false, LOG_LINES]);
    assert.equal(afterLink(state, 'open').log.lines.length, 0);
});
