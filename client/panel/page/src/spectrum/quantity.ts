// The two values of a channel, each a level from 0 to 100.

export type Quantity = 'congestion' | 'interference';

export const QUANTITIES: readonly Quantity[] = ['congestion', 'interference'];

/** The level of what is not known. */
export const NONE = 255;
export const TOP_LEVEL = 100;

interface Scale {
    name: string;
    unit: string;
    /** What level 0 reads. */
    offset: number;
}

/** An interference is told in dB above -120 dBm. */
export const SCALES: Record<Quantity, Scale> = {
    congestion: { name: 'Congestion', unit: '%', offset: 0 },
    interference: { name: 'Interference', unit: 'dBm', offset: -120 },
};

const MINUS = '\u2212';

/** A number with a real minus sign. */
export function signed(value: number, digits = 0): string {
    const text = Math.abs(value).toFixed(digits);
    return value < 0 && Number(text) !== 0 ? MINUS + text : text;
}

/** The figure alone; a dash for what is not known. */
export function figure(quantity: Quantity, level: number, digits = 0): string {
    return Number.isNaN(level) || level === NONE ? '\u2013' : signed(level + SCALES[quantity].offset, digits);
}

/** With its unit. */
export function levelText(quantity: Quantity, level: number): string {
    return level === NONE ? 'not known' : `${figure(quantity, level)}\u00a0${SCALES[quantity].unit}`;
}
