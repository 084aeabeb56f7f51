import { Store } from '../app/store';
import type { Service } from '../app/service';
import type { SpectrumHistory } from './SpectrumHistory';

const PATIENCE = 1500;
const LONGEST_PATIENCE = 10_000;
const LOOK = 250;
// Where another client scans, nobody tells that it has stopped.
const SILENCE = 5000;

export const RESUMED = 'No values came for a while: another client may have stopped the scan, it was asked for again.';

/**
 * Keeps a scan going that the user wants. There is one for all clients, and whoever stops it stops it for all: one that
 * falls silent is asked for again.
 */
export class ScanKeeper {
    readonly isOn = new Store(false);
    /** Values have come back after the scan was asked for again. */
    readonly resumed = new Store(false);
    readonly #service: Pick<Service, 'ask'>;
    readonly #history: Pick<SpectrumHistory, 'told' | 'lastTold'>;
    #toldBefore = 0;
    #hasValues = false;
    #isRenewed = false;
    #asked = 0;
    #patience = PATIENCE;

    constructor(service: Pick<Service, 'ask'>, history: Pick<SpectrumHistory, 'told' | 'lastTold'>) {
        this.#service = service;
        this.#history = history;
    }

    start(now: number): void {
        this.#hasValues = this.#isRenewed = false;
        this.resumed.set(false);
        this.#patience = PATIENCE;
        this.isOn.set(true);
        this.#ask(now);
    }

    stop(): void {
        if (this.isOn.get()) this.#service.ask('spectral', 'STOP_SCAN');
        this.isOn.set(false);
    }

    /** To be called a few times a second. What an adapter takes for a scan the first values tell. */
    look(now: number): void {
        if (!this.isOn.get()) return;
        if (this.#history.told !== this.#toldBefore) this.#takeValues();
        else if (now - Math.max(this.#asked, this.#history.lastTold) > this.#patience) this.#renew(now);
    }

    #takeValues(): void {
        this.#toldBefore = this.#history.told;
        if (!this.#hasValues) this.#patience = Math.max(PATIENCE, 2 * (this.#history.lastTold - this.#asked));
        this.#hasValues = true;
        if (this.#isRenewed) this.resumed.set(true);
        this.#isRenewed = false;
    }

    #renew(now: number): void {
        if (!this.#hasValues) this.#patience = Math.min(2 * this.#patience, LONGEST_PATIENCE);
        this.#isRenewed = this.#hasValues;
        this.#ask(now);
    }

    #ask(now: number): void {
        this.#asked = now;
        this.#toldBefore = this.#history.told;
        this.#service.ask('spectral', 'FULL_SCAN');
    }
}

/** A keeper that looks by itself, begins anew with a service that comes back, and stops its scan with the page. */
export function keepScan(service: Service, history: SpectrumHistory): ScanKeeper {
    const keeper = new ScanKeeper(service, history);
    const isUp = () => service.state.get().link === 'open' && service.state.get().running === true;
    let wasUp = isUp();
    const trust = () => (history.patience = keeper.isOn.get() ? Infinity : SILENCE);
    keeper.isOn.subscribe(trust);
    trust();
    service.state.subscribe(() => {
        if (isUp() && !wasUp && keeper.isOn.get()) keeper.start(performance.now());
        if (!isUp() && wasUp) history.forget();
        wasUp = isUp();
    });
    window.setInterval(() => {
        if (isUp()) keeper.look(performance.now());
    }, LOOK);
    window.addEventListener('pagehide', () => keeper.stop());
    return keeper;
}
