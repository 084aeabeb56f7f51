// The messages between the page and the relay.

export type ServicePort = 'spectral' | 'hotspot';
export type Port = ServicePort | 'panel';

/** An event of the service, its data read. */
export interface ServiceEvent {
    port: ServicePort;
    id: string;
    /** What `Data` holds; undefined if there is none or it can't be read. */
    data: unknown;
    /** When it came, in milliseconds of its source: since the page was loaded, or since a recording's start. */
    at: number;
}

export interface RecordingState {
    active: boolean;
    name: string;
    events: number;
    /** Milliseconds. */
    elapsed: number;
}

export interface RecordingFile {
    name: string;
    bytes: number;
}

/** What the relay tells of itself. */
export type PanelMessage =
    | { event: 'service'; running: boolean; hotspot?: boolean }
    | { event: 'log'; on: boolean; lines: string[] }
    | ({ event: 'recording' } & RecordingState)
    | { event: 'recordings'; files: RecordingFile[] }
    | { event: 'failure'; text: string };

/** What stands in a list in place of a password. An edit that sends it back keeps the stored one. */
export const HIDDEN_PASSWORD = '********';

function parsed(text: unknown): unknown {
    if (typeof text !== 'string' || text === '') return undefined;
    try {
        return JSON.parse(text);
    } catch {
        return undefined;
    }
}

/** Null if the message is no event. */
export function readEvent(port: ServicePort, message: unknown, at: number): ServiceEvent | null {
    if (typeof message !== 'object' || message === null) return null;
    const { EventId: id, Data: data } = message as Record<string, unknown>;
    return typeof id === 'string' ? { port, id, data: parsed(data), at } : null;
}

/** A command as the ports want it: data are JSON text within JSON. */
export function commandMessage(id: string, data?: unknown): object {
    return data === undefined ? { CommandId: id } : { CommandId: id, Data: JSON.stringify(data) };
}
