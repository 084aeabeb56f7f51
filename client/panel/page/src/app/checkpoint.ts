import type { Service } from './service';
import type { ServiceEvent } from './protocol';

const QUESTION = 'GET_IS_CARD_IN';
// The answer to somebody else's question looks like the answer to ours.
const SURE = 2;

/**
 * Tells when the service has certainly gone past a command that was sent before: it handles commands in order, and
 * answers this question whatever its state.
 */
export class Checkpoint {
    #answers = 0;

    /** Asks behind the command; `enough`: how many answers are waited for. */
    constructor(
        private readonly ask: () => void,
        private readonly enough = SURE,
    ) {
        ask();
    }

    static behind(service: Service, enough = SURE): Checkpoint {
        return new Checkpoint(() => service.ask('hotspot', QUESTION), enough);
    }

    get isPassed(): boolean {
        return this.#answers >= this.enough;
    }

    take(event: ServiceEvent): void {
        if (this.isPassed || event.port !== 'hotspot' || !event.id.startsWith('CARD_PLUG_')) return;
        this.#answers++;
        if (!this.isPassed) this.ask();
    }
}

export function isUp(service: Service): boolean {
    const { link, running } = service.state.get();
    return link === 'open' && running === true;
}

/** When the service has gone past all commands that were sent until now; false if it is lost first. */
export function handled(service: Service): Promise<boolean> {
    if (!isUp(service)) return Promise.resolve(false);
    return new Promise((resolve) => {
        const end = (isHandled: boolean) => {
            stopEvents();
            stopState();
            resolve(isHandled);
        };
        const stopEvents = service.onEvent((event) => {
            checkpoint.take(event);
            if (checkpoint.isPassed) end(true);
        });
        const stopState = service.state.subscribe(() => {
            if (!isUp(service)) end(false);
        });
        const checkpoint = Checkpoint.behind(service);
    });
}
