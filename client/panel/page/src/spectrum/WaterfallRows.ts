import { NONE, QUANTITIES, type Quantity } from './quantity';
import { STEP, type SpectrumHistory } from './SpectrumHistory';

/** A waterfall has so many rows, whatever time they stand for. */
export const ROWS = 300;

/** The longest time that the rows of a history can fill. */
const LONGEST = 600_000;

/**
 * The rows of a waterfall, a ring: each the greatest level of some rows of the history, so that a short burst is seen
 * in a long time, too. Holds what it shows by itself, however long it is looked at.
 */
export class WaterfallRows {
    readonly columns: number;
    /** Milliseconds of one row. */
    readonly rowTime: number;
    /** One behind the newest row; a row's number is its time divided by rowTime. */
    end = -1;
    readonly #levels: Record<Quantity, Uint8Array>;
    readonly #history: SpectrumHistory;
    readonly #generation: number;

    constructor(history: SpectrumHistory, length: number) {
        this.#history = history;
        this.#generation = history.generation;
        this.columns = history.channels.length;
        this.rowTime = WaterfallRows.rowTimeOf(length);
        const make = () => new Uint8Array(this.columns * ROWS).fill(NONE);
        this.#levels = { congestion: make(), interference: make() };
    }

    /** The time of a row where all show `length` milliseconds, or what a history keeps at most. */
    static rowTimeOf(length: number): number {
        return Math.min(length, LONGEST) / ROWS;
    }

    /** False: it is another history, or has begun anew. */
    isOf(history: SpectrumHistory): boolean {
        return history === this.#history && history.generation === this.#generation;
    }

    /** The place of a row in the ring, backwards, so that going up in the ring is going back in time. */
    static slotOf(row: number): number {
        return ROWS - 1 - (row % ROWS);
    }

    /** Takes in the rows that are complete before this step of the history. */
    fill(endStep = this.#history.endStep): void {
        const steps = this.rowTime / STEP;
        const end = Math.floor(endStep / steps);
        const oldest = Math.floor(this.#history.firstStep / steps);
        for (let row = Math.max(this.end, end - ROWS, oldest, 0); row < end; row++) this.#fillRow(row, steps);
        if (end > this.end) this.end = end;
    }

    level(quantity: Quantity, row: number, column: number): number {
        if (row >= this.end || row < this.end - ROWS || row < 0) return NONE;
        return this.#levels[quantity][WaterfallRows.slotOf(row) * this.columns + column];
    }

    #fillRow(row: number, steps: number): void {
        const begin = WaterfallRows.slotOf(row) * this.columns;
        for (const quantity of QUANTITIES) {
            for (let column = 0; column < this.columns; column++) {
                let greatest = NONE;
                for (let step = row * steps; step < (row + 1) * steps; step++) {
                    const level = this.#history.level(quantity, step, column);
                    if (level !== NONE && (greatest === NONE || level > greatest)) greatest = level;
                }
                this.#levels[quantity][begin + column] = greatest;
            }
        }
    }
}
