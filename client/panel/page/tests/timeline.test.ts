import assert from 'node:assert/strict';
import { test } from 'node:test';
import { storyOf } from '../src/networks/timeline';

const NAMES: Record<number, string> = { 1: '“Lounge”', 2: '“Work”' };
const told = (...texts: string[]) =>
    storyOf(
        texts.flatMap((text, i) => `[${i + 1}] 11/25 22:07:0${i % 10}  ${text}`.split('\n')),
        (id) => NAMES[id],
    );
const stepsOf = (story: ReturnType<typeof told>, index = 0) => story.attempts[index].steps.map((step) => step.text);

const ASKED = [
    '###Manually connect to a BSS started.###',
    'Unblocked network with ssid=Gate, 12 and mac address=02:aa:00:00:00:02 due to user has manually connected to it.',
    'Try to connect to HS20 network using next credential.',
    'Selecting credential with id=2',
    '\nConnect to network Gate, 12',
    'Connection start event: connection initiated by HS20, profile name=Gate, 12',
];
const CHOOSING = ['\n>>>> Enter connectNetwork', 'Enter findBestMatchBssAndCredential...'];

test('an attempt that was asked for is told step by step', () => {
    const refused = told(
        ...ASKED,
        'Connection failed! profile name=Gate, 12',
        'Connection using EAP-TLS with authMode=machineOrUser failed,trying to use EAP-TLS with authMode=machine.',
        'Connection start event: connection initiated by HS20, profile name=Gate, 12',
        'Connection failed! profile name=Gate, 12',
        'Manual connection failed, we will try to use next credential.',
        'Selecting credential with id=1',
        'Connection failed! profile name=Gate, 12',
        'We have tried all credentials, connection failed.',
        'Reason code desc=The user name or password is not correct, or the certificate wa',
    );
    assert.deepEqual(stepsOf(refused), [
        'A join was asked for',
        'Tries “Work”',
        'The system began to connect',
        'Refused',
        'The certificate is tried once more, as the machine’s',
        'The system began to connect',
        'Refused',
        'Tries “Lounge”',
        'Refused',
        'No credential is left to try',
        'Given up: The user name or password is not correct, or the certificate wa…',
    ]);
    const [attempt] = refused.attempts;
    assert.deepEqual([attempt.network, attempt.isAsked, attempt.end], ['Gate, 12', true, 'failed']);
    assert.equal(attempt.steps[0].at, '11/25 22:07:01');
});

test('an attempt ends as the log says', () => {
    const joined = ['Connection succeeded! profile name=Gate, 12', 'Reason code desc=The operation was successful.'];
    const dropped = ['Received Wlan disconnected event.', 'Reason code desc=The driver disconnected.'];
    const cases: [string, string[], string, string][] = [
        ['under way', [], 'running', 'The system began to connect'],
        ['joined', joined, 'joined', 'Joined'],
        ['dropped later', [...joined, ...dropped], 'ended', 'The connection ended: The driver disconnected.'],
        ['an end of another connection first', [...dropped, ...joined], 'joined', 'Joined'],
        ['could not begin', ['connectBss failed.'], 'failed', 'It could not begin'],
        [
            'left to the system',
            [
                'No credential found for this HS20 network, turn to use normal routine',
                'ERROR: Cannot get profile in profile manager.',
            ],
            'failed',
            'What came of the system’s own attempt is not told',
        ],
    ];
    for (const [name, more, end, last] of cases) {
        const story = told(...ASKED, ...more);
        assert.deepEqual([story.attempts.length, story.attempts[0].end, stepsOf(story).at(-1)], [1, end, last], name);
    }
    const cut = told('Connection failed! profile name=Café', 'Reason code desc=No.');
    assert.deepEqual(stepsOf(cut), ['An attempt was under way', 'Refused', 'Given up: No.']);
});

test('the last round tells why each network was not chosen', () => {
    const story = told(
        ...CHOOSING,
        'This network has been disconnected by user, skip auto connecting to ssid=Old news',
        'No matching network was found based on configured credentials.',
        ...CHOOSING,
        '\t[1] Checking HS20 network with ssid=####Gate 12#### and bssid=02:aa:00:00:00:01',
        '\tChecking credential with id=2 name=Work, realm=corp.example, priority=1',
        '\tSelected cred id=2',
        '\tSelecting credential with id=2 name=Work and bss with ssid=Gate 12',
        '\t[2] Checking HS20 network with ssid=####Departures#### and bssid=02:aa:00:00:00:02',
        '\tChecking credential with id=1 name=Lounge, realm=lounge.example, priority=1',
        '\tRetry number exceeds maximum retry limit, skip this credential id=1, ssid=Departures',
        '\tChecking credential with id=2 name=Work, realm=corp.example, priority=1',
        '\tSelected cred id=2',
        '\t[3] Checking HS20 network with ssid=####Café#### and bssid=02:aa:00:00:00:04',
        'This network has been disconnected by user, skip auto connecting to ssid=Library',
        '\t[5] Checking HS20 network with ssid=####Lounge#### and bssid=02:aa:00:00:00:05',
        '\tChecking credential with id=1 name=Lounge, realm=lounge.example, priority=1',
        'Credential is not configured as auto-connect, skipping...',
        '!!!Found a credential with id=2 for network with ssid=Gate 12',
    );
    const reasons = Object.fromEntries([...story.looks].map(([name, look]) => [name, look.reasons]));
    assert.deepEqual(reasons, {
        'Gate 12': [],
        Departures: [
            '“Lounge” was refused there, and has no attempts left.',
            '“Work” fits; “Gate 12” was chosen before it.',
        ],
        Café: ['No stored credential fits it.'],
        Library: ['It was left by hand: the service stays away until a join is asked for.'],
        Lounge: ['“Lounge” is not used by itself, only when a join is asked for.'],
    });
    assert.deepEqual(stepsOf(story), ['The service chose it by itself, with “Work”']);
    assert.equal(story.gate, null);
});

test('what holds all of it up is told until a round comes further', () => {
    const silent = 'Not all HS20 network ANQP info fetched, we will query the ANQP info first before auto connecting.';
    assert.match(told(silent).gate?.text ?? '', /not told its realms/);
    assert.equal(told(silent, ...CHOOSING).gate, null);
    assert.equal(told(silent, 'SupplicantMgr initiailization succeeded.').gate, null);
});
