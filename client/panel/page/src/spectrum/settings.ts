import { Store } from '../app/store';
import type { Quantity } from './quantity';
import { WINDOWS, type TimeWindow } from './statistics';
import type { Width } from './blocks';

/** How the spectrum is looked at. It outlives the view, which comes and goes with its tab. */
export interface Settings {
    quantity: Quantity;
    window: TimeWindow;
    width: Width;
    /** The channels whose time course is drawn, in the order of the colours. Null: nobody has chosen yet. */
    drawn: readonly number[] | null;
}

export const MOST_DRAWN = 6;

export const settings = new Store<Settings>({ quantity: 'congestion', window: WINDOWS[1], width: 20, drawn: null });

export function change(part: Partial<Settings>): void {
    settings.update((all) => ({ ...all, ...part }));
}

/** The channels with this one added or taken away; the first goes where there are too many. */
export function toggled(drawn: readonly number[], channel: number): number[] {
    if (drawn.includes(channel)) return drawn.filter((number) => number !== channel);
    return [...drawn, channel].slice(-MOST_DRAWN);
}
