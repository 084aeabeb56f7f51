import { createContext } from 'preact';
import { useContext, useEffect, useRef } from 'preact/hooks';
import { commandMessage, type PanelMessage, type Port, type ServiceEvent, type ServicePort } from './protocol';
import { afterEvent, afterLink, afterPanelMessage, INITIAL_STATE, type LinkState, type State } from './state';
import { Store, useStore } from './store';

export type Send = (port: Port, message: object) => void;

/**
 * The service as the page sees it: what it told, and the way to ask it. One that is played from a recording has
 * no way to ask.
 */
export class Service {
    readonly state: Store<State>;
    #listeners = new Set<(event: ServiceEvent) => void>();
    #send: Send | null;

    constructor(send: Send | null) {
        this.#send = send;
        this.state = new Store(INITIAL_STATE);
    }

    get isLive(): boolean {
        return this.#send !== null;
    }

    /** Called with each event, after the state took it. Returns what ends that. */
    onEvent(listener: (event: ServiceEvent) => void): () => void {
        this.#listeners.add(listener);
        return () => this.#listeners.delete(listener);
    }

    takeEvent(event: ServiceEvent): void {
        this.state.update((state) => afterEvent(state, event));
        for (const listener of [...this.#listeners]) listener(event);
    }

    takePanelMessage(message: PanelMessage): void {
        this.state.update((state) => afterPanelMessage(state, message));
    }

    takeLink(link: LinkState): void {
        this.state.update((state) => afterLink(state, link));
    }

    /** Sends a command of docs/client-protocol.md. Without a service it is dropped. */
    ask(port: ServicePort, id: string, data?: unknown): void {
        this.#send?.(port, commandMessage(id, data));
    }

    askPanel(command: string): void {
        this.#send?.('panel', { command });
    }
}

export const ServiceContext = createContext<Service>(new Service(null));

/** The service that the page shows: the live one, or that of a recording. */
export function useService(): Service {
    return useContext(ServiceContext);
}

/** What `select` takes of the state, by Object.is: select what is there, make nothing new in it. */
export function useServiceState<S>(select: (state: State) => S): S {
    return useStore(useService().state, select);
}

/** Whether commands reach the service now. Controls that need one are disabled without. */
export function useCanCommand(): boolean {
    const service = useService();
    const isUp = useServiceState((state) => state.link === 'open' && state.running === true);
    return service.isLive && isUp;
}

/** Calls `handle` with each event for as long as the component is there. */
export function useServiceEvent(handle: (event: ServiceEvent) => void): void {
    const service = useService();
    const latest = useRef(handle);
    latest.current = handle;
    useEffect(() => service.onEvent((event) => latest.current(event)), [service]);
}
