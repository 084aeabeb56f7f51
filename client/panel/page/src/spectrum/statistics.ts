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

function statistics(
    history: SpectrumHistory,
    { sum, count, least, greatest }: ReturnType<SpectrumHistory['totals']>,
): LevelStatistics[] {
    return history.channels.map((_, column) =>
        count[column] === 0
            ? UNKNOWN
            : { mean: sum[column] / count[column], least: least[column], greatest: greatest[column] },
    );
}

function ofRows(history: SpectrumHistory, quantity: Quantity, first: number, end: number): LevelStatistics[] {
    const columns = history.channels.length;
    const sum = new Float64Array(columns);
    const count = new Float64Array(columns);
    const least = new Uint8Array(columns).fill(NONE);
    const greatest = new Uint8Array(columns);
    history.eachRow(quantity, first, end, (levels, begin) => {
        for (let column = 0; column < columns; column++) {
            const level = levels[begin + column];
            if (level === NONE) continue;
            sum[column] += level;
            count[column]++;
            if (level < least[column]) least[column] = level;
            if (level > greatest[column]) greatest[column] = level;
        }
    });
    return statistics(history, { sum, count, least, greatest });
}

/** By column, for the rows of the window that ends before `end`. */
export function statisticsOf(
    history: SpectrumHistory,
    quantity: Quantity,
    length: number,
    end = history.endStep,
): LevelStatistics[] {
    if (length === Infinity) return statistics(history, history.totals(quantity));
    return ofRows(history, quantity, end - length / STEP, end);
}
