import type { ServiceEvent } from './protocol';
import type { Service } from './service';

/** What the page has to ask for, as the service tells it by itself only when it changes. */
export function askForAll(service: Service): void {
    service.ask('hotspot', 'GET_IS_CARD_IN');
    service.ask('hotspot', 'GET_RADIO');
    service.ask('spectral', 'GET_CHANNEL_LIST');
    service.ask('spectral', 'GET_CURRENT_CHANNEL');
    askForLists(service);
}

function askForLists(service: Service): void {
    service.ask('hotspot', 'GET_ALL_CREDENTIAL_LIST');
    service.ask('hotspot', 'GET_ALL_NETWORK_LIST');
    service.ask('hotspot', 'GET_IS_INTERNET_ACCESS');
}

/**
 * Asks for all when the service comes up, and for what an event makes necessary: no list follows a join, and
 * without an adapter none was sent.
 */
export function askWhenNeeded(service: Service): void {
    let wasUp = false;
    let hadAdapter: boolean | null = null;
    service.state.subscribe(() => {
        const { link, running, adapter } = service.state.get();
        const isUp = link === 'open' && running === true;
        if (isUp && !wasUp) askForAll(service);
        if (isUp && wasUp && adapter === true && hadAdapter !== true) {
            askForLists(service);
            service.ask('spectral', 'GET_CHANNEL_LIST');
        }
        wasUp = isUp;
        hadAdapter = isUp ? adapter : null;
    });
    service.onEvent((event: ServiceEvent) => {
        if (event.id === 'CONNECT_DISCONNECT') service.ask('hotspot', 'GET_ALL_NETWORK_LIST');
    });
}
