import type { ScanKeeper } from '../spectrum/scan';
import type { SpectrumHistory } from '../spectrum/SpectrumHistory';
import type { Service } from './service';
import { Store } from './store';

/** Where what is shown comes from: the live service, or a recording. */
export interface Source {
    service: Service;
    spectrum: SpectrumHistory;
    /** The time now, in milliseconds of the source: that of its events. */
    now(): number;
    /** The epoch time of 0. */
    epoch: number;
    /** Null where nothing can be asked. */
    scan: ScanKeeper | null;
}

/** The source that is shown. */
export const shownSource = new Store<Source | null>(null);
