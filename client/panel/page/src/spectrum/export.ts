// The spectrum as files. A level stands until the next line of its channel, as the service tells it.

import { frequencyOf } from './channels';
import { NONE, SCALES } from './quantity';
import { KEPT_STEPS, STEP, type SpectrumHistory } from './SpectrumHistory';

interface Line {
    time: string;
    channel: number;
    mhz: number;
    congestion: number | null;
    interference: number | null;
}

const LINES_OF_PIECE = 4096;

function value(level: number, offset: number): number | null {
    return level === NONE ? null : level + offset;
}

/** The lines of a stretch of rows: of each channel the first one, and each that differs from the one before. */
function* linesOf(history: SpectrumHistory, length: number, end: number, epoch: number): Generator<Line> {
    const begin = Math.max(history.firstStep, end - Math.min(length / STEP, KEPT_STEPS));
    const told = history.channels.map(() => -1);
    for (let step = begin; step < end; step++) {
        for (let column = 0; column < history.channels.length; column++) {
            const congestion = history.level('congestion', step, column);
            const interference = history.level('interference', step, column);
            const both = congestion * 256 + interference;
            if (both === told[column]) continue;
            told[column] = both;
            const { number } = history.channels[column];
            yield {
                time: new Date(epoch + step * STEP).toISOString(),
                channel: number,
                mhz: frequencyOf(number),
                congestion: value(congestion, 0),
                interference: value(interference, SCALES.interference.offset),
            };
        }
    }
}

const CSV_HEAD = 'time,channel,mhz,congestion_percent,interference_dbm\n';

function csvLine({ time, channel, mhz, congestion, interference }: Line): string {
    return `${time},${channel},${mhz},${congestion ?? ''},${interference ?? ''}\n`;
}

function jsonLine({ time, channel, mhz, congestion, interference }: Line): string {
    return `${JSON.stringify({ time, channel, mhz, congestion_percent: congestion, interference_dbm: interference })}\n`;
}

function pieces(lines: Iterable<Line>, write: (line: Line) => string, head: string): string[] {
    const whole: string[] = [];
    let piece = head;
    let count = 0;
    for (const line of lines) {
        piece += write(line);
        if (++count % LINES_OF_PIECE !== 0) continue;
        whole.push(piece);
        piece = '';
    }
    whole.push(piece);
    return whole;
}

export type TextFormat = 'csv' | 'jsonl';

/** The text of a file, in pieces; `end` is one behind its last step. */
export function spectrumText(
    history: SpectrumHistory,
    format: TextFormat,
    length: number,
    end: number,
    epoch: number,
): string[] {
    const lines = linesOf(history, length, end, epoch);
    return format === 'csv' ? pieces(lines, csvLine, CSV_HEAD) : pieces(lines, jsonLine, '');
}
