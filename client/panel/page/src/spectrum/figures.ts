import { NONE, QUANTITIES, type Quantity } from './quantity';
import type { SpectrumHistory } from './SpectrumHistory';
import { statisticsOf, type LevelStatistics } from './statistics';
import type { ChannelLoad } from './blocks';

/** What the table, the bars and the choice of a channel go by, taken at one moment. By column. */
export interface Figures {
    now: Record<Quantity, number[]>;
    window: Record<Quantity, LevelStatistics[]>;
}

export function takeFigures(history: SpectrumHistory, length: number, end = history.endStep): Figures {
    const of = <T>(value: (quantity: Quantity) => T) =>
        Object.fromEntries(QUANTITIES.map((quantity) => [quantity, value(quantity)])) as Record<Quantity, T>;
    return {
        now: of((quantity) => history.channels.map((_, column) => history.current(quantity, column))),
        window: of((quantity) => statisticsOf(history, quantity, length, end)),
    };
}

export function loadsOf(history: SpectrumHistory, { now, window }: Figures): ChannelLoad[] {
    return history.channels.map(({ number }, column) => ({
        number,
        mean: window.congestion[column]?.mean ?? NaN,
        now: now.congestion[column] === NONE ? (window.congestion[column]?.mean ?? NaN) : now.congestion[column],
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
