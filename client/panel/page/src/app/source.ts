import { SpectrumHistory } from '../spectrum/SpectrumHistory';
import { Service } from './service';
import { Store } from './store';

/** Where what is shown comes from: the live service, or a recording. */
export interface Source {
    service: Service;
    spectrum: SpectrumHistory;
    /** The time now, in milliseconds of the source: that of its events. */
    now(): number;
    /** The epoch time of 0. */
    epoch: number;
}

/** The source that is shown. */
export const shownSource = new Store<Source | null>(null);
