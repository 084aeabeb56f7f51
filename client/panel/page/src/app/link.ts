import type { PanelMessage, Port, ServiceEvent } from './protocol';
import { readEvent } from './protocol';
import type { LinkState } from './state';

const FIRST_DELAY = 250;
const LONGEST_DELAY = 5000;

/** What a link tells. */
export interface LinkListener {
    onState(state: LinkState): void;
    onEvent(event: ServiceEvent): void;
    onPanelMessage(message: PanelMessage): void;
}

/** The milliseconds to wait before the next try, after so many that failed: twice as long each time, spread a little. */
export function reconnectDelay(failures: number, random: number): number {
    const delay = Math.min(FIRST_DELAY * 2 ** Math.min(failures, 10), LONGEST_DELAY);
    return delay * (0.75 + random / 2);
}

/** The connection to the relay. One that is lost is sought again until it is there. */
export class Link {
    #address: string;
    #listener: LinkListener;
    #socket: WebSocket | null = null;
    #failures = 0;
    #timer = 0;

    constructor(address: string, listener: LinkListener) {
        this.#address = address;
        this.#listener = listener;
        window.addEventListener('online', () => this.#hurry());
        document.addEventListener('visibilitychange', () => {
            if (!document.hidden) this.#hurry();
        });
    }

    open(): void {
        const socket = new WebSocket(this.#address);
        this.#socket = socket;
        socket.onopen = () => {
            this.#failures = 0;
            this.#listener.onState('open');
        };
        socket.onmessage = (message) => this.#take(message.data);
        socket.onclose = () => this.#lose();
    }

    /** Drops what can't be sent now. */
    send(port: Port, message: object): void {
        if (this.#socket?.readyState === WebSocket.OPEN) this.#socket.send(JSON.stringify({ port, message }));
    }

    #lose(): void {
        this.#socket = null;
        this.#listener.onState('lost');
        this.#timer = window.setTimeout(() => this.#retry(), reconnectDelay(this.#failures++, Math.random()));
    }

    #retry(): void {
        this.#timer = 0;
        this.open();
    }

    // A page that was hidden or away has long waits behind it.
    #hurry(): void {
        if (this.#timer === 0) return;
        window.clearTimeout(this.#timer);
        this.#failures = 0;
        this.#retry();
    }

    #take(text: unknown): void {
        if (typeof text !== 'string') return;
        const { port, message } = JSON.parse(text) as { port: Port; message: unknown };
        if (port === 'panel') {
            this.#listener.onPanelMessage(message as PanelMessage);
            return;
        }
        const event = readEvent(port, message, performance.now());
        if (event) this.#listener.onEvent(event);
    }
}
