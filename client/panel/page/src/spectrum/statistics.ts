// What a stretch of rows tells of each channel.

import { NONE, type Quantity } from './quantity';
import { STEP, type SpectrumHistory } from './SpectrumHistory';

/** The stretch of time that is looked at. */
export interface TimeWindow {
    label: string;
    /** Milliseconds; Infinity is all since the start. */
    length: number;
}

export const WINDOWS: readonly TimeWindow[] = [
    { label: '30 s', length: 30_000 },
    { label: '2 min', length: 120_000 },
    { label: '10 min', length: 600_000 },
    { label: 'All', length: Infinity },
];

/** Levels of one channel over a window; the mean is not a number, the others are NONE where nothing is known. */
export interface LevelStatistics {
    mean: number;
    least: number;
    greatest: number;
}

const UNKNOWN: LevelStatistics = { mean: NaN, least: NONE, greatest: NONE };

function ofAll(history: SpectrumHistory, quantity: Quantity): LevelStatistics[] {
    const { sum, count, least, greatest } = history.totals(quantity);
    return history.channels.map((_, column) =>
        count[column] === 0
            ? UNKNOWN
            : { mean: sum[column] / count[column], least: least[column], greatest: greatest[column] },
    );
}

function ofColumn(history: SpectrumHistory, quantity: Quantity, column: number, begin: number, end: number) {
    let sum = 0;
    let count = 0;
    let least = NONE;
    let greatest = 0;
    for (let step = begin; step < end; step++) {
        const level = history.level(quantity, step, column);
        if (level === NONE) continue;
        sum += level;
        count++;
        if (level < least) least = level;
        if (level > greatest) greatest = level;
    }
    return count === 0 ? UNKNOWN : { mean: sum / count, least, greatest };
}

/** By column, for the rows of the window that ends before `end`. */
export function statisticsOf(
    history: SpectrumHistory,
    quantity: Quantity,
    length: number,
    end = history.endStep,
): LevelStatistics[] {
    if (length === Infinity) return ofAll(history, quantity);
    const begin = Math.max(history.firstStep, end - length / STEP);
    return history.channels.map((_, column) => ofColumn(history, quantity, column, begin, end));
}
