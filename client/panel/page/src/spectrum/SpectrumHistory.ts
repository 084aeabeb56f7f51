import type { ServiceEvent } from '../app/protocol';
import { channelsOf, type Channel } from '../app/state';
import { NONE, type Quantity } from './quantity';

/** The time of one row, in milliseconds. */
export const STEP = 100;
/** So many rows are kept: ten minutes. */
export const KEPT_STEPS = 6000;

/** What is known of one value of all channels, by column. */
class Levels {
    now: Uint8Array;
    rows: Uint8Array;
    /** Of all rows since the start. */
    sum: Float64Array;
    count: Float64Array;
    least: Uint8Array;
    greatest: Uint8Array;

    constructor(columns: number) {
        this.now = new Uint8Array(columns).fill(NONE);
        this.rows = new Uint8Array(columns * KEPT_STEPS).fill(NONE);
        this.sum = new Float64Array(columns);
        this.count = new Float64Array(columns);
        this.least = new Uint8Array(columns).fill(NONE);
        this.greatest = new Uint8Array(columns);
    }

    note(column: number, level: number): void {
        if (level > this.greatest[column]) this.greatest[column] = level;
        if (level < this.least[column]) this.least[column] = level;
    }
}

interface Told {
    congestion: number;
    interference: number;
}

function isSameList(a: readonly Channel[], b: readonly Channel[]): boolean {
    return a.length === b.length && a.every((one, i) => one.number === b[i].number && one.order === b[i].order);
}

/**
 * What the spectral analyser told, as rows of equal time: a level of each channel, which stands until another is
 * told. Rows are named by their step, the time divided by STEP. The last KEPT_STEPS are kept, and sums of all.
 */
export class SpectrumHistory {
    /** By number. The places in here are the columns. */
    channels: readonly Channel[] = [];
    /** Another number: all rows are new ones. */
    generation = 0;
    /** Counts the values told. */
    told = 0;
    /** When the last one was told. */
    lastTold = -Infinity;
    /**
     * After so many milliseconds in which nothing was told a value is none any more. The service tells only what
     * changes: while a scan runs a value stands however long.
     */
    patience = Infinity;

    #levels: Record<Quantity, Levels> = { congestion: new Levels(0), interference: new Levels(0) };
    #toldStep = new Float64Array(0);
    #columns = new Map<number, number>();
    #values = new Map<number, Told>();
    #hasList = false;
    #isRadioOn = true;
    #isCardIn = true;
    #firstStep = -1;
    #endStep = -1;

    /** The first step that is kept. */
    get firstStep(): number {
        return Math.max(this.#firstStep, this.#endStep - KEPT_STEPS);
    }

    /** One behind the last complete row. */
    get endStep(): number {
        return this.#endStep;
    }

    level(quantity: Quantity, step: number, column: number): number {
        if (step < this.firstStep || step >= this.#endStep) return NONE;
        return this.#levels[quantity].rows[(step % KEPT_STEPS) * this.channels.length + column];
    }

    /** The rows of a stretch that is kept, one after the other: `levels` has those of the columns from `begin` on. */
    eachRow(quantity: Quantity, first: number, end: number, visit: (levels: Uint8Array, begin: number) => void): void {
        const { rows } = this.#levels[quantity];
        const last = Math.min(end, this.#endStep);
        for (let step = Math.max(first, this.firstStep); step < last; step++)
            visit(rows, (step % KEPT_STEPS) * this.channels.length);
    }

    /** The level that stands now. */
    current(quantity: Quantity, column: number): number {
        return this.#isPresent(this.#endStep * STEP) ? this.#standing(quantity, column, this.#endStep) : NONE;
    }

    /** Of all since the start: the sum of the rows' levels, how many there were, the least and the greatest level. */
    totals(quantity: Quantity): Pick<Levels, 'sum' | 'count' | 'least' | 'greatest'> {
        return this.#levels[quantity];
    }

    take(event: ServiceEvent): void {
        if (event.port !== 'spectral') return;
        this.advance(event.at);
        const data = event.data as Record<string, number> | null | undefined;
        switch (event.id) {
            case 'SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION':
                if (data) this.takeSample(event.at, data.order, 'congestion', data.congestion_value);
                break;
            case 'SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE':
                if (data) this.takeSample(event.at, data.order, 'interference', data.noise_value);
                break;
            case 'SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G':
                this.#takeList(event.data);
                break;
            case 'RADIO_ON':
            case 'RADIO_OFF':
                this.#isRadioOn = event.id === 'RADIO_ON';
                break;
            case 'CARD_PLUG_IN':
            case 'CARD_PLUG_OUT':
                this.#isCardIn = event.id === 'CARD_PLUG_IN';
                break;
        }
    }

    takeSample(at: number, order: number, quantity: Quantity, level: number): void {
        if (!(level >= 0 && level <= 100)) return;
        this.advance(at);
        this.told++;
        this.lastTold = at;
        const value = this.#values.get(order) ?? { congestion: NONE, interference: NONE };
        value[quantity] = level;
        this.#values.set(order, value);
        const column = this.#columns.get(order);
        if (column === undefined) return;
        this.#levels[quantity].now[column] = level;
        this.#levels[quantity].note(column, level);
        if (this.#toldStep[column] < 0) this.#toldStep[column] = Math.floor(at / STEP);
    }

    /** Completes the rows that lie before `now`. */
    advance(now: number): void {
        const end = Math.floor(now / STEP);
        if (this.#endStep < 0) this.#firstStep = this.#endStep = end;
        if (end - this.#endStep > KEPT_STEPS) this.#skip(end - KEPT_STEPS);
        while (this.#endStep < end) this.#completeRow(this.#endStep++);
    }

    /** No value is known any more; the rows stay. */
    forget(): void {
        this.#values.clear();
        this.#toldStep.fill(-1);
        for (const levels of Object.values(this.#levels)) levels.now.fill(NONE);
    }

    /** Begins anew, with the channels and the values that stand. */
    clear(): void {
        this.#begin();
    }

    /** As new: of another time, or another recording. */
    reset(): void {
        this.channels = [];
        this.#values.clear();
        this.#hasList = false;
        this.#isRadioOn = this.#isCardIn = true;
        this.told = 0;
        this.lastTold = -Infinity;
        this.#endStep = -1;
        this.#begin();
    }

    // Values speak of orders. Those that came before the first list belong to it; another list makes them void.
    #takeList(data: unknown): void {
        if (data === undefined) return;
        const channels = channelsOf(data);
        const isSame = isSameList(channels, this.channels);
        if (this.#hasList && !isSame) this.#values.clear();
        this.#hasList = true;
        if (isSame) return;
        this.channels = channels;
        this.#begin();
    }

    #begin(): void {
        const columns = this.channels.length;
        this.generation++;
        this.#firstStep = this.#endStep;
        this.#levels = { congestion: new Levels(columns), interference: new Levels(columns) };
        this.#toldStep = new Float64Array(columns).fill(-1);
        this.#columns = new Map(this.channels.map(({ order }, column) => [order, column]));
        this.channels.forEach(({ order }, column) => {
            const value = this.#values.get(order);
            if (!value) return;
            this.#levels.congestion.now[column] = value.congestion;
            this.#levels.interference.now[column] = value.interference;
        });
    }

    #isPresent(now: number): boolean {
        return this.#isRadioOn && this.#isCardIn && now - this.lastTold <= this.patience;
    }

    // The service tells no value that is 0 from the start: where one was told, the other is 0. Both come in one burst.
    #standing(quantity: Quantity, column: number, step: number): number {
        const level = this.#levels[quantity].now[column];
        const toldStep = this.#toldStep[column];
        return level === NONE && toldStep >= 0 && toldStep < step ? 0 : level;
    }

    #completeRow(step: number): void {
        const columns = this.channels.length;
        const begin = (step % KEPT_STEPS) * columns;
        const isPresent = this.#isPresent(step * STEP);
        for (const quantity of ['congestion', 'interference'] as const) {
            const levels = this.#levels[quantity];
            if (!isPresent) {
                levels.rows.fill(NONE, begin, begin + columns);
                continue;
            }
            for (let column = 0; column < columns; column++) {
                const level = this.#standing(quantity, column, step);
                levels.rows[begin + column] = level;
                if (level === NONE) continue;
                levels.sum[column] += level;
                levels.count[column]++;
                levels.note(column, level);
            }
        }
    }

    // Nobody looked for so long that all that is kept would be written more than once.
    #skip(step: number): void {
        this.#endStep = step;
    }
}
