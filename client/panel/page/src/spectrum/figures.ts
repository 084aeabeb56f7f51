import { NONE, QUANTITIES, type Quantity } from './quantity';
import type { SpectrumHistory } from './SpectrumHistory';
import { statisticsOf, type LevelStatistics } from './statistics';
import type { Bars } from './SpectrumPicture';
import type { ChannelLoad } from './blocks';

/** What the table, the bars and the choice of a channel go by, taken at one moment. By column. */
export interface Figures {
    now: Record<Quantity, number[]>;
    window: Record<Quantity, LevelStatistics[]>;
}

/** As they are now, or where the time stands still: one behind the last step that counts. */
export function takeFigures(history: SpectrumHistory, length: number, pausedStep: number | null): Figures {
    const of = <T>(value: (quantity: Quantity) => T) =>
        Object.fromEntries(QUANTITIES.map((quantity) => [quantity, value(quantity)])) as Record<Quantity, T>;
    const level = (quantity: Quantity, column: number) =>
        pausedStep === null ? history.current(quantity, column) : history.level(quantity, pausedStep - 1, column);
    return {
        now: of((quantity) => history.channels.map((_, column) => level(quantity, column))),
        window: of((quantity) => statisticsOf(history, quantity, length, pausedStep ?? history.endStep)),
    };
}

/** The bars at this moment, with the highest that the figures tell. */
export function barsOf(history: SpectrumHistory, figures: Figures, quantity: Quantity, isPaused: boolean): Bars {
    const now = isPaused
        ? figures.now[quantity]
        : history.channels.map((_, column) => history.current(quantity, column));
    const peak = now.map((level, column) => {
        const greatest = figures.window[quantity][column]?.greatest ?? NONE;
        if (greatest === NONE || level === NONE) return Math.min(greatest, level);
        return Math.max(greatest, level);
    });
    return { now, peak };
}

export function loadsOf(history: SpectrumHistory, { now, window }: Figures): ChannelLoad[] {
    return history.channels.map(({ number }, column) => ({
        number,
        mean: window.congestion[column]?.mean ?? NaN,
        now: now.congestion[column] === NONE ? NaN : now.congestion[column],
        interference: window.interference[column]?.mean ?? NaN,
    }));
}

/** The channels that were busiest, the busiest first. */
export function busiest(history: SpectrumHistory, { window }: Figures, count: number): number[] {
    return history.channels
        .map(({ number }, column) => ({ number, mean: window.congestion[column]?.mean ?? NaN }))
        .filter(({ mean }) => !Number.isNaN(mean))
        .sort((a, b) => b.mean - a.mean)
        .slice(0, count)
        .map(({ number }) => number);
}
