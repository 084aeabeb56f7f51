import type { PanelMessage, RecordingFile, RecordingState, ServiceEvent } from './protocol';

export type LinkState = 'connecting' | 'open' | 'lost';

export type EapMethod = 'EAP-TLS' | 'EAP-TTLS';

export interface Realm {
    name: string;
    /** 1 EAP-TLS, 2 EAP-TTLS; the service may tell others. */
    method: number;
}

export interface Network {
    name: string;
    type: number;
    isConnected: boolean;
    /** Connected: it reaches the internet. Else: it says that it offers it. */
    hasInternet: boolean;
    realmsKnown: boolean;
    realms: Realm[];
}

/** A credential with the service's own names, so that it can be sent back as it came. */
export interface Credential {
    Id: number;
    /** 1 user name and password, 3 certificate. */
    Type: number;
    /** 1 all users, 2 this one. */
    AccessType: number;
    CredentialEapMethod: number;
    AutoConnect: boolean;
    CredentialName: string;
    /** The realm. */
    RealName: string;
    Creator: string;
    CaCert: string;
    ClientCert: string;
    Username: string;
    /** HIDDEN_PASSWORD, or empty where none is stored. */
    Password: string;
}

/** A channel of the adapter; values name it by its order. */
export interface Channel {
    number: number;
    order: number;
}

export interface LogState {
    on: boolean;
    /** The newest, at most LOG_LINES. */
    lines: readonly string[];
}

/** All that is known of the service, but for the spectrum's values. Null: not told yet. */
export interface State {
    link: LinkState;
    running: boolean | null;
    adapter: boolean | null;
    radio: boolean | null;
    /** The hotspot switch, as it is written down; it is told when it is turned, and by a list of networks. */
    hotspot: boolean | null;
    internet: boolean | null;
    /** As listed; empty with the radio or the hotspot switch off. */
    networks: readonly Network[] | null;
    /** In the order of priority. */
    credentials: readonly Credential[] | null;
    channels: readonly Channel[] | null;
    /** On which the adapter is connected; 0: on none. */
    currentChannel: number | null;
    log: LogState;
    recording: RecordingState | null;
    recordings: readonly RecordingFile[];
}

export const LOG_LINES = 4000;
// No adapter tells more to the service.
const MOST_CHANNELS = 256;

const NOTHING_OF_SERVICE = {
    adapter: null,
    radio: null,
    hotspot: null,
    internet: null,
    networks: null,
    credentials: null,
    channels: null,
    currentChannel: null,
} as const;

export const INITIAL_STATE: State = {
    ...NOTHING_OF_SERVICE,
    link: 'connecting',
    running: null,
    log: { on: false, lines: [] },
    recording: null,
    recordings: [],
};

type Fields = Record<string, unknown>;

function rows(data: unknown): Fields[] {
    return Array.isArray(data) ? data.filter((row) => typeof row === 'object' && row !== null) : [];
}

const text = (value: unknown) => (typeof value === 'string' ? value : '');
const number = (value: unknown) => (typeof value === 'number' ? value : 0);

function networkOf(row: Fields): Network {
    const isConnected = row.IsConnected === true;
    return {
        name: text(row.NetWorkName),
        type: number(row.NetworkType),
        isConnected,
        hasInternet: row.IsInternetAccess === (isConnected ? 0 : 2),
        realmsKnown: row.RealmFetched === true,
        realms: rows(row.SupportRealmList).map((realm) => ({
            name: text(realm.RealmName),
            method: number(realm.CredentialEapMethod),
        })),
    };
}

function credentialOf(row: Fields): Credential {
    return {
        Id: number(row.Id),
        Type: number(row.Type),
        AccessType: number(row.AccessType),
        CredentialEapMethod: number(row.CredentialEapMethod),
        AutoConnect: row.AutoConnect === true,
        CredentialName: text(row.CredentialName),
        RealName: text(row.RealName),
        Creator: text(row.Creator),
        CaCert: text(row.CaCert),
        ClientCert: text(row.ClientCert),
        Username: text(row.Username),
        Password: text(row.Password),
    };
}

function withNetworks(state: State, data: unknown): State {
    const networks = rows(data).map(networkOf);
    return { ...state, networks, hotspot: Array.isArray(data) ? true : state.hotspot };
}

/** The channels of a list, by number. */
export function channelsOf(data: unknown): Channel[] {
    return rows(data)
        .slice(0, MOST_CHANNELS)
        .map((row) => ({ number: number(row.Channel), order: number(row.Order) }))
        .sort((a, b) => a.number - b.number);
}

/** The state after an event. */
export function afterEvent(state: State, event: ServiceEvent): State {
    const { data } = event;
    switch (event.id) {
        case 'CARD_PLUG_IN':
            return { ...state, adapter: true };
        case 'CARD_PLUG_OUT':
            return { ...state, adapter: false, networks: [], internet: null, currentChannel: 0 };
        case 'RADIO_ON':
        case 'RADIO_OFF':
            return { ...state, radio: event.id === 'RADIO_ON' };
        case 'GET_RADIO':
            return typeof data === 'boolean' ? { ...state, radio: data } : state;
        case 'SET_HOTSPOT_AUTO_CONNECT':
            return typeof data === 'boolean' ? { ...state, hotspot: data } : state;
        case 'GET_IS_INTERNET_ACCESS':
            return typeof data === 'boolean' ? { ...state, internet: data } : state;
        case 'GET_ALL_NETWORK_LIST':
            return data === undefined ? state : withNetworks(state, data);
        case 'GET_ALL_CREDENTIAL_LIST':
            return data === undefined ? state : { ...state, credentials: rows(data).map(credentialOf) };
        case 'SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G':
            return data === undefined ? state : { ...state, channels: channelsOf(data) };
        case 'SPECTRAL_ANALYSER_CURRENT_CHANNEL_DATA':
            return typeof data === 'number' ? { ...state, currentChannel: data } : state;
        default:
            return state;
    }
}

/** The state after a message of the relay. */
export function afterPanelMessage(state: State, message: PanelMessage): State {
    switch (message.event) {
        case 'service':
            return message.running
                ? { ...state, running: true, hotspot: message.hotspot ?? state.hotspot }
                : { ...state, ...NOTHING_OF_SERVICE, running: false };
        case 'log':
            return {
                ...state,
                log: { on: message.on, lines: [...state.log.lines, ...message.lines].slice(-LOG_LINES) },
            };
        case 'recording': {
            const { event: _, ...recording } = message;
            return { ...state, recording };
        }
        case 'recordings':
            return { ...state, recordings: message.files };
        default:
            return state;
    }
}

/** The state with a new state of the link. The relay tells the log from its end each time. */
export function afterLink(state: State, link: LinkState): State {
    return { ...state, link, log: link === 'open' ? { on: false, lines: [] } : state.log };
}
