import { readEvent, type ServiceEvent } from '../app/protocol';
import { NONE, type Quantity } from '../spectrum/quantity';
import { Column } from './Column';
import { LineStore } from './LineStore';

/** The head of a recording. */
export interface RecordingHeader {
    version: string;
    /** The epoch time of its start. */
    started: number;
}

/** The values of all orders at a time, so that a seek need not begin at the start. */
interface Keyframe {
    at: number;
    /** The first sample behind it. */
    sample: number;
    /** By twice the order, the congestion first. */
    levels: Uint8Array;
}

const FORMAT = 1;
const KEYFRAME_TIME = 30_000;
// Orders count from 1, and a list has at most 256.
const LAST_ORDER = 256;
const INTERFERENCE = 0x80;
const CHANNEL_LIST = 'SPECTRAL_ANALYSER_CHANNEL_LIST_DATA_2G5G';
const MARKS = new Set([CHANNEL_LIST, 'RADIO_ON', 'RADIO_OFF', 'CARD_PLUG_IN', 'CARD_PLUG_OUT']);

/** Null if the line is none of a header. Throws for a format that is not known. */
export function readHeader(line: string): RecordingHeader | null {
    const object = parsed(line);
    if (!object || object.recording !== 'vexa' || typeof object.format !== 'number') return null;
    if (object.format > FORMAT) throw new Error(`It has the format ${object.format}, which only a later vexa reads.`);
    return { version: String(object.version ?? ''), started: Date.parse(String(object.started)) || 0 };
}

function parsed(line: string): Record<string, unknown> | null {
    try {
        const value: unknown = JSON.parse(line);
        return typeof value === 'object' && value !== null ? (value as Record<string, unknown>) : null;
    } catch {
        return null;
    }
}

/** The event of a line, its end, or null if the line is none of a recording. */
function readLine(line: string): { at: number; event: ServiceEvent | null } | null {
    const object = parsed(line);
    const at = object?.ms;
    if (!object || typeof at !== 'number' || !Number.isInteger(at) || at < 0) return null;
    if (object.end === true) return { at, event: null };
    if (object.port !== 'sa' && object.port !== 'hs20') return null;
    const event = readEvent(object.port === 'sa' ? 'spectral' : 'hotspot', object.event, at);
    return event && { at, event };
}

// What most lines of a recording are, as the service writes them. Any other form takes the long way.
const SAMPLE =
    /^\{"event":\{"Data":"\{\\n +\\"(congestion|noise)_value\\" : (\d+),\\n +\\"order\\" : (\d+)\\n\}\\n","EventId":"SPECTRAL_ANALYSER_SAMPLE_DATA_[^"]*","Source":"[^"]*","Timestamp":"[^"]*"\},"ms":(\d+),"port":"sa"\}$/;

function sampleOf({ id, data }: ServiceEvent): [Quantity, number, number] | null {
    if (typeof data !== 'object' || data === null) return null;
    const { order, congestion_value: congestion, noise_value: noise } = data as Record<string, number>;
    if (id === 'SPECTRAL_ANALYSER_SAMPLE_DATA_CONGESTION') return ['congestion', order, congestion];
    if (id === 'SPECTRAL_ANALYSER_SAMPLE_DATA_INTERFERENCE') return ['interference', order, noise];
    return null;
}

/**
 * A recording that can be entered anywhere: the values of the spectrum as columns of numbers, all other events by where
 * they lie. Lines are added in their order; times that go back count as the latest before.
 */
export class RecordingIndex {
    readonly header: RecordingHeader;
    /** Milliseconds. */
    duration = 0;
    /** The recorder wrote its end. */
    isWhole = false;

    readonly #sampleTimes = new Column(Uint32Array);
    readonly #orders = new Column(Uint16Array);
    readonly #levels = new Column(Uint8Array);
    readonly #keyframes: Keyframe[] = [];
    readonly #standing = new Uint8Array(2 * (LAST_ORDER + 1)).fill(NONE);

    readonly #eventTimes = new Column(Uint32Array);
    readonly #lines = new LineStore();
    readonly #eventsOfId = new Map<string, Column<Uint32Array>>();
    readonly #marks: ServiceEvent[] = [];
    #channels = '';

    constructor(header: RecordingHeader) {
        this.header = header;
    }

    get sampleCount(): number {
        return this.#sampleTimes.length;
    }

    /** Of other events. */
    get eventCount(): number {
        return this.#eventTimes.length;
    }

    /** False: the line is none of a recording. */
    add(line: string): boolean {
        const match = SAMPLE.exec(line);
        if (match) {
            const quantity = match[1] === 'noise' ? 'interference' : 'congestion';
            this.#addSample(this.#take(Number(match[4])), quantity, Number(match[3]), Number(match[2]));
            return true;
        }
        const read = readLine(line);
        if (!read) return false;
        const at = this.#take(read.at);
        if (!read.event) this.isWhole = true;
        else this.#addEvent(line, { ...read.event, at });
        return true;
    }

    /** To be called after the last line. */
    finish(): void {
        this.#lines.seal();
    }

    /** The place of the first sample after a time, and of the first other event. */
    firstSampleAfter(time: number): number {
        return this.#sampleTimes.firstAbove(time);
    }

    firstEventAfter(time: number): number {
        return this.#eventTimes.firstAbove(time);
    }

    /** The events of the spectrum that are no samples, after one time and up to another. */
    marks(after: number, until: number): ServiceEvent[] {
        return this.#marks.filter(({ at }) => at > after && at <= until);
    }

    sample(index: number): { at: number; order: number; quantity: Quantity; level: number } {
        const packed = this.#levels.at(index);
        return {
            at: this.#sampleTimes.at(index),
            order: this.#orders.at(index),
            quantity: packed & INTERFERENCE ? 'interference' : 'congestion',
            level: packed & ~INTERFERENCE,
        };
    }

    /** The last keyframe up to a time; an empty one before the first. */
    keyframe(time: number): Keyframe {
        const later = this.#keyframes.findIndex(({ at }) => at > time);
        const place = (later < 0 ? this.#keyframes.length : later) - 1;
        return this.#keyframes[place] ?? { at: 0, sample: 0, levels: new Uint8Array(0) };
    }

    async event(index: number): Promise<ServiceEvent> {
        const { event } = readLine(await this.#lines.read(index))!;
        return { ...event!, at: this.#eventTimes.at(index) };
    }

    /** The places of the last event of each kind up to a time, in their order. */
    latestEvents(time: number): number[] {
        const end = this.firstEventAfter(time);
        const latest: number[] = [];
        for (const places of this.#eventsOfId.values()) {
            const count = places.firstAbove(end - 1);
            if (count > 0) latest.push(places.at(count - 1));
        }
        return latest.sort((a, b) => a - b);
    }

    #take(at: number): number {
        this.duration = Math.max(this.duration, at);
        return this.duration;
    }

    #addSample(at: number, quantity: Quantity, order: number, level: number): void {
        if (!(order >= 0 && order <= LAST_ORDER && level >= 0 && level <= 100)) return;
        this.#addKeyframe(at);
        this.#sampleTimes.push(at);
        this.#orders.push(order);
        this.#levels.push(quantity === 'interference' ? level | INTERFERENCE : level);
        this.#standing[2 * order + (quantity === 'interference' ? 1 : 0)] = level;
    }

    #addKeyframe(at: number): void {
        if (at < (this.#keyframes.at(-1)?.at ?? 0) + KEYFRAME_TIME) return;
        this.#keyframes.push({ at, sample: this.sampleCount, levels: this.#standing.slice() });
    }

    #addEvent(line: string, event: ServiceEvent): void {
        const sample = sampleOf(event);
        if (sample) {
            this.#addSample(event.at, ...sample);
            return;
        }
        const place = this.#eventTimes.length;
        this.#eventTimes.push(event.at);
        this.#lines.add(line);
        const places = this.#eventsOfId.get(event.id) ?? new Column(Uint32Array);
        this.#eventsOfId.set(event.id, places);
        places.push(place);
        if (event.port === 'spectral' && MARKS.has(event.id)) this.#addMark(event);
    }

    // Another list of channels makes the values void.
    #addMark(event: ServiceEvent): void {
        this.#marks.push(event);
        if (event.id !== CHANNEL_LIST) return;
        const channels = JSON.stringify(event.data);
        if (this.#channels !== '' && channels !== this.#channels) this.#standing.fill(NONE);
        this.#channels = channels;
    }
}
