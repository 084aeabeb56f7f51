// What the diagnostic log tells of how networks are chosen and joined.

import { printable } from '../app/text';
import { quoted } from '../credentials/words';

export type Mood = 'plain' | 'good' | 'bad';

export interface Step {
    /** As the log has it: `11/25 22:07:09`. */
    at: string;
    mood: Mood;
    text: string;
}

export type End = 'running' | 'joined' | 'failed' | 'ended';

/** From the wish to join a network to what came of it, and to the end of the connection. */
export interface Attempt {
    network: string;
    isAsked: boolean;
    steps: Step[];
    end: End;
}

/** What the last round that chose had against a network. */
export interface Look {
    at: string;
    reasons: string[];
}

export interface LogStory {
    /** The oldest first. */
    attempts: Attempt[];
    looks: Map<string, Look>;
    /** Why the service chooses no network now; null if it came as far. */
    gate: { at: string; text: string } | null;
}

/** What the credential of this id is called. */
export type Naming = (id: number) => string;

const HEAD = /^\[\d+\] (\d\d\/\d\d \d\d:\d\d:\d\d) {2}/;
// The system's words are cut there.
const REASON_LENGTH = 63;
const SUCCESS = 'The operation was successful.';

const GATES: Record<string, string> = {
    'HS20 functionality not enabled': 'The hotspot switch is off.',
    'Radio turned off': 'The radio is off.',
    'Supplicant not in disconnected state': 'The adapter is connected or busy.',
    'Connection already started': 'An attempt is under way.',
    'No HS20 BSS': 'No hotspot network is in range.',
    'No credential, wait': 'No credential is stored.',
    'We are querying the HS20 network ANQP info': 'The networks are being asked for their realms.',
    'Not all HS20 network ANQP info fetched': 'A network has not told its realms yet; until then none is chosen.',
    'Current session is not active': 'The user’s session is not active: log on, or unlock the screen.',
};

class Reader {
    readonly story: LogStory = { attempts: [], looks: new Map(), gate: null };
    at = '';
    #candidates = new Map<string, number>();
    #looked: string | null = null;
    #checked = 0;
    #open: Attempt | null = null;
    #connected: Attempt | null = null;
    #isDisconnected = false;

    constructor(readonly name: Naming) {}

    restart(): void {
        this.story.looks.clear();
        this.story.gate = null;
        this.#open = this.#connected = null;
    }

    beginRound(): void {
        this.story.gate = null;
        this.story.looks.clear();
        this.#candidates.clear();
    }

    shut(text: string): void {
        this.story.gate = { at: this.at, text };
    }

    look(network: string): void {
        this.#looked = network;
        this.story.looks.set(network, { at: this.at, reasons: [] });
    }

    object(network: string | null, reason: string): void {
        if (network === null) return;
        const look = this.story.looks.get(network) ?? { at: this.at, reasons: [] };
        look.reasons.push(reason);
        this.story.looks.set(network, look);
    }

    check(id: number): void {
        this.#checked = id;
    }

    waitsToBeAsked(): void {
        this.object(this.#looked, `${this.name(this.#checked)} is not used by itself, only when a join is asked for.`);
    }

    suggest(id: number): void {
        if (this.#looked !== null) this.#candidates.set(this.#looked, id);
    }

    choose(id: number, network: string): void {
        this.endRound(network);
        this.begin(network, false, `The service chose it by itself, with ${this.name(id)}`);
    }

    endRound(chosen: string | null): void {
        for (const [network, look] of this.story.looks) {
            const id = this.#candidates.get(network);
            if (network !== chosen && id !== undefined && chosen !== null)
                look.reasons.push(`${this.name(id)} fits; ${quoted(chosen)} was chosen before it.`);
            else if (id === undefined && look.reasons.length === 0) look.reasons.push('No stored credential fits it.');
        }
    }

    begin(network: string, isAsked: boolean, text: string): void {
        this.#open = { network, isAsked, steps: [], end: 'running' };
        this.story.attempts.push(this.#open);
        this.step(text);
    }

    step(text: string, mood: Mood = 'plain'): void {
        this.#open?.steps.push({ at: this.at, mood, text });
    }

    finish(text: string, end: End): void {
        this.step(text, end === 'failed' ? 'bad' : 'plain');
        if (this.#open) this.#open.end = end;
        this.#open = null;
    }

    /** The result of a step; the log may begin behind the attempt's beginning. */
    result(network: string, text: string, mood: Mood): void {
        if (this.#open?.network !== network) this.begin(network, false, 'An attempt was under way');
        this.step(text, mood);
    }

    succeed(network: string): void {
        this.result(network, 'Joined', 'good');
        this.#connected = this.#open!;
        this.#connected.end = 'joined';
        this.#open = null;
    }

    disconnect(): void {
        this.#isDisconnected = true;
    }

    /** Behind a result that is told to clients, and behind the end of a connection. */
    reason(text: string): void {
        const words = printable(text) + (text.length >= REASON_LENGTH ? '…' : '');
        if (this.#isDisconnected) this.#endConnection(words);
        else if (this.#open && text !== SUCCESS) this.finish(`Given up: ${words}`, 'failed');
        this.#isDisconnected = false;
    }

    #endConnection(words: string): void {
        this.#connected?.steps.push({ at: this.at, mood: 'plain', text: `The connection ended: ${words}` });
        if (this.#connected) this.#connected.end = 'ended';
        this.#connected = null;
    }
}

type Row = [beginning: string, take: (reader: Reader, rest: string) => void];

const ROWS: Row[] = [
    ['SupplicantMgr initiailization succeeded.', (reader) => reader.restart()],
    ...Object.entries(GATES).map(([beginning, text]): Row => [beginning, (reader) => reader.shut(text)]),

    ['Enter findBestMatchBssAndCredential', (reader) => reader.beginRound()],
    [
        'This network has been disconnected by user, skip auto connecting to ssid=',
        (reader, rest) => reader.object(rest, 'It was left by hand: the service stays away until a join is asked for.'),
    ],
    ['Checking credential with id=', (reader, rest) => reader.check(parseInt(rest))],
    ['Credential is not configured as auto-connect', (reader) => reader.waitsToBeAsked()],
    [
        'Retry number exceeds maximum retry limit, skip this credential id=',
        (reader, rest) => {
            const [id, network] = rest.split(', ssid=');
            reader.object(network ?? null, `${reader.name(parseInt(id))} was refused there, and has no attempts left.`);
        },
    ],
    ['Selected cred id=', (reader, rest) => reader.suggest(parseInt(rest))],
    ['No matching network was found based on configured credentials.', (reader) => reader.endRound(null)],
    [
        '!!!Found a credential with id=',
        (reader, rest) => {
            const [id, network] = rest.split(' for network with ssid=');
            if (network !== undefined) reader.choose(parseInt(id), network);
        },
    ],

    [
        'Unblocked network with ssid=',
        (reader, rest) => {
            const [network, why] = rest.split(' and mac address=');
            if (why?.includes('manually connected')) reader.begin(network, true, 'A join was asked for');
        },
    ],
    [
        'Connection start event: connection initiated by HS20, profile name=',
        (reader) => reader.step('The system began to connect'),
    ],
    ['wlan_notification_msm_associated', (reader) => reader.step('The access point let it in')],
    ['wlan_notification_msm_authenticating', (reader) => reader.step('The provider checks the credential')],
    ['WlanConnect call failed', (reader, rest) => reader.step(`The system refused to begin${rest.replace('with ', '')}`, 'bad')],
    ['Connection failed! profile name=', (reader, rest) => reader.result(rest, 'Refused', 'bad')],
    [
        'Connection using EAP-TLS with authMode=machineOrUser failed',
        (reader) => reader.step('The certificate is tried once more, as the machine’s'),
    ],
    ['We have tried all credentials, connection failed.', (reader) => reader.step('No credential is left to try', 'bad')],
    [
        'No credential found for this HS20 network, turn to use normal routine',
        (reader) => reader.step('No credential fits: it was left to the system'),
    ],
    [
        'ERROR: Cannot get profile in profile manager.',
        (reader) => reader.finish('What came of the system’s own attempt is not told', 'failed'),
    ],
    [
        'The ANQP info of the network to be connected has no realm info',
        (reader) => reader.finish('Its realms are not known yet: nothing was tried', 'failed'),
    ],
    ['connectBss failed.', (reader) => reader.finish('It could not begin', 'failed')],
    ['Connection succeeded! profile name=', (reader, rest) => reader.succeed(rest)],
    ['Received Wlan disconnected event.', (reader) => reader.disconnect()],
    ['Reason code desc=', (reader, rest) => reader.reason(rest)],
];

// The same words stand in both: of a round's choice with a name behind the id, which a later row tells better.
const CHECKING = /^\[\d+\] Checking HS20 network with ssid=####(.*)#### and bssid=/;
const SELECTING = /^Selecting credential with id=(\d+)$/;

function take(reader: Reader, text: string): void {
    const checking = CHECKING.exec(text);
    const selecting = SELECTING.exec(text);
    if (checking) reader.look(checking[1]);
    else if (selecting) reader.step(`Tries ${reader.name(Number(selecting[1]))}`);
    else for (const [beginning, act] of ROWS) if (text.startsWith(beginning)) act(reader, text.slice(beginning.length));
}

/** Out of lines of the log, the oldest first. */
export function storyOf(lines: readonly string[], name: Naming): LogStory {
    const reader = new Reader(name);
    for (const line of lines) {
        const head = HEAD.exec(line);
        if (head) reader.at = head[1];
        take(reader, line.slice(head ? head[0].length : 0).trim());
    }
    return reader.story;
}
