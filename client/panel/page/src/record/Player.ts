import { Service } from '../app/service';
import type { Source } from '../app/source';
import { afterEvent, INITIAL_STATE, type State } from '../app/state';
import { Store } from '../app/store';
import { QUANTITIES, NONE } from '../spectrum/quantity';
import { KEPT_STEPS, SpectrumHistory, STEP } from '../spectrum/SpectrumHistory';
import type { RecordingIndex } from './RecordingIndex';

export const SPEEDS = [1, 2, 5, 10, 30, 60] as const;

export interface Playing {
    /** Milliseconds since the recording's start. */
    position: number;
    isPlaying: boolean;
    speed: number;
}

const TICK = 50;
const KEPT = KEPT_STEPS * STEP;

const PLAYED: State = { ...INITIAL_STATE, link: 'open', running: true };

/** Plays a recording into a source of its own. */
export class Player {
    readonly name: string;
    readonly index: RecordingIndex;
    readonly source: Source;
    readonly state = new Store<Playing>({ position: 0, isPlaying: false, speed: 1 });
    readonly #service = new Service(null);
    readonly #spectrum = new SpectrumHistory();
    #seeks = 0;
    /** The last seek that has been carried out. */
    #settled = 0;
    #isBusy = false;
    #timer = 0;
    #last = 0;

    constructor(name: string, index: RecordingIndex) {
        this.name = name;
        this.index = index;
        this.source = {
            service: this.#service,
            spectrum: this.#spectrum,
            now: () => this.state.get().position,
            epoch: index.header.started,
            scan: null,
        };
        void this.seek(0);
    }

    play(): void {
        const { position, isPlaying } = this.state.get();
        if (isPlaying) return;
        if (position >= this.index.duration) void this.seek(0);
        this.#change({ isPlaying: true });
        this.#last = performance.now();
        this.#timer = window.setInterval(() => void this.#tick(), TICK);
    }

    pause(): void {
        window.clearInterval(this.#timer);
        this.#change({ isPlaying: false });
    }

    setSpeed(speed: number): void {
        this.#change({ speed });
    }

    /** Shows how things stood at a time, with the ten minutes of the spectrum before it. */
    async seek(wanted: number): Promise<void> {
        const position = Math.min(Math.max(0, wanted), this.index.duration);
        const seek = ++this.#seeks;
        this.#change({ position });
        this.#fillSpectrum(position);
        const events = await Promise.all(this.index.latestEvents(position).map((place) => this.index.event(place)));
        if (seek !== this.#seeks) return;
        this.#service.state.set(events.reduce(afterEvent, PLAYED));
        this.#settled = seek;
    }

    #change(part: Partial<Playing>): void {
        this.state.update((all) => ({ ...all, ...part }));
    }

    #fillSpectrum(position: number): void {
        const begin = Math.max(0, position - KEPT);
        const { at, sample, levels } = this.index.keyframe(begin);
        const spectrum = this.#spectrum;
        spectrum.reset();
        spectrum.advance(at);
        for (const mark of this.index.marks(-1, at)) spectrum.take({ ...mark, at });
        levels.forEach((level, place) => {
            if (level !== NONE) spectrum.takeSample(at, place >> 1, QUANTITIES[place & 1], level);
        });
        this.#playSpectrum(sample, at, position);
    }

    /** Takes in what the spectrum told from a sample on, and after a time, until another. */
    #playSpectrum(firstSample: number, after: number, until: number): void {
        const marks = this.index.marks(after, until);
        const end = this.index.firstSampleAfter(until);
        let mark = 0;
        for (let place = firstSample; place < end; place++) {
            const { at, order, quantity, level } = this.index.sample(place);
            while (mark < marks.length && marks[mark].at <= at) this.#spectrum.take(marks[mark++]);
            this.#spectrum.takeSample(at, order, quantity, level);
        }
        while (mark < marks.length) this.#spectrum.take(marks[mark++]);
        this.#spectrum.advance(until);
    }

    // What is read from a file may take longer than a tick: the next one then plays more.
    async #tick(): Promise<void> {
        if (this.#isBusy) return;
        const now = performance.now();
        const passed = now - this.#last;
        this.#last = now;
        if (this.#settled !== this.#seeks) return;
        const { position, speed } = this.state.get();
        const until = Math.min(position + passed * speed, this.index.duration);
        this.#isBusy = true;
        try {
            await this.#playUntil(position, until);
        } finally {
            this.#isBusy = false;
        }
        if (this.state.get().position >= this.index.duration) this.pause();
    }

    async #playUntil(position: number, until: number): Promise<void> {
        const seek = this.#seeks;
        const end = this.index.firstEventAfter(until);
        for (let place = this.index.firstEventAfter(position); place < end; place++) {
            const event = await this.index.event(place);
            if (seek !== this.#seeks) return;
            this.#service.takeEvent(event);
        }
        this.#playSpectrum(this.index.firstSampleAfter(position), position, until);
        this.#change({ position: until });
    }
}
