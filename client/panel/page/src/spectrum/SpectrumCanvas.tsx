import { useLayoutEffect, useRef } from 'preact/hooks';
import { announce } from '../app/notices';
import type { Source } from '../app/source';
import { clockText } from '../app/text';
import { look } from '../app/theme';
import type { Quantity } from './quantity';
import { readoutText } from './readout';
import { SpectrumPicture, type Bars, type Spot } from './SpectrumPicture';
import { WaterfallImage } from './WaterfallImage';
import { ROWS, WaterfallRows } from './WaterfallRows';

interface Props {
    source: Source;
    quantity: Quantity;
    /** Milliseconds from top to bottom. */
    length: number;
    /** The step of the history at which the picture stands still; null: it runs. */
    pausedStep: number | null;
    /** The bars at this moment. */
    bars(): Bars;
    /** Where the words go for what the pointer is at; not through the state of a component, as it changes with each frame. */
    readout: { current: HTMLElement | null };
    /** A channel was chosen. */
    onChoose(channel: number): void;
    canvas: { current: HTMLCanvasElement | null };
}

const KEY_ROWS = 10;
const UNREAD = 'Point at a channel to read its values.';

/** What moves within the picture, apart from the component: the frames, the pointer, the keys. */
class Drawing {
    props!: Props;
    readonly #picture: SpectrumPicture;
    #image: WaterfallImage | null = null;
    #spot: Spot | null = null;
    #isDirty = true;
    #frame = 0;
    #told = -1;

    constructor(canvas: HTMLCanvasElement) {
        this.#picture = new SpectrumPicture(canvas);
        const loop = () => {
            this.#draw();
            this.#frame = requestAnimationFrame(loop);
        };
        this.#frame = requestAnimationFrame(loop);
    }

    end(): void {
        cancelAnimationFrame(this.#frame);
    }

    resize(width: number, height: number): void {
        this.#picture.resize(width, height, devicePixelRatio);
        this.#isDirty = true;
    }

    takeTheme(): void {
        this.#picture.takeTheme();
        this.#isDirty = true;
    }

    /** Something of the properties has changed. */
    touch(): void {
        this.#isDirty = true;
    }

    point(x: number, y: number): void {
        this.#spot = this.#picture.spotAt(x, y);
        this.#isDirty = true;
    }

    leave(): void {
        this.#spot = null;
        this.#isDirty = true;
    }

    /** Moves by keys. Tells whether the key was one of ours. */
    press(key: string): boolean {
        const last = this.props.source.spectrum.channels.length - 1;
        const spot = this.#spot ?? { column: 0, age: -1 };
        const moved: Record<string, Spot> = {
            ArrowLeft: { ...spot, column: Math.max(0, spot.column - 1) },
            ArrowRight: { ...spot, column: Math.min(last, spot.column + 1) },
            ArrowUp: { ...spot, age: Math.max(-1, spot.age - KEY_ROWS) },
            ArrowDown: { ...spot, age: Math.min(ROWS - 1, spot.age + KEY_ROWS) },
            Home: { ...spot, column: 0 },
            End: { ...spot, column: last },
        };
        if (last < 0 || !moved[key]) return false;
        this.#spot = this.#spot ? moved[key] : spot;
        this.#isDirty = true;
        const words = this.#words();
        if (words) announce(words);
        return true;
    }

    chosen(): number | null {
        return this.#spot ? (this.props.source.spectrum.channels[this.#spot.column]?.number ?? null) : null;
    }

    #draw(): void {
        const { source, pausedStep } = this.props;
        const isPaused = pausedStep !== null;
        source.spectrum.advance(source.now());
        const image = this.#currentImage();
        const isNew = !isPaused && image.update();
        const isTold = !isPaused && source.spectrum.told !== this.#told;
        if (!isNew && !isTold && !this.#isDirty) return;
        this.#isDirty = false;
        this.#told = source.spectrum.told;
        const newest = isPaused ? clockText(source.epoch + image.rows.end * image.rows.rowTime) : 'now';
        this.#picture.draw(image, this.props.bars(), this.#spot, newest);
        if (this.props.readout.current) this.props.readout.current.textContent = this.#words() ?? UNREAD;
    }

    #words(): string | null {
        const { source } = this.props;
        return this.#spot && this.#image
            ? readoutText(source.spectrum, this.#image.rows, this.#spot, source.epoch)
            : null;
    }

    // Another quantity is painted anew from the same rows; another time or history needs others.
    #currentImage(): WaterfallImage {
        const { source, quantity, length, pausedStep } = this.props;
        const rows = this.#image?.rows;
        const fits = rows?.isOf(source.spectrum) && rows.rowTime === WaterfallRows.rowTimeOf(length);
        if (this.#image && fits && this.#image.quantity === quantity) return this.#image;
        const next = rows && fits ? rows : new WaterfallRows(source.spectrum, length);
        if (next !== rows) {
            next.fill(pausedStep ?? undefined);
            this.#picture.setChannels(source.spectrum.channels);
            this.#spot = null;
        }
        this.#image = new WaterfallImage(next, quantity);
        this.#isDirty = true;
        return this.#image;
    }
}

/** The picture, with its pointer and keys. */
export function SpectrumCanvas(props: Props) {
    const drawing = useRef<Drawing | null>(null);
    useLayoutEffect(() => {
        const canvas = props.canvas.current!;
        const made = new Drawing(canvas);
        made.props = props;
        drawing.current = made;
        const fit = () => made.resize(canvas.clientWidth, canvas.clientHeight);
        const observer = new ResizeObserver(fit);
        observer.observe(canvas);
        fit();
        const forget = look.subscribe(() => made.takeTheme());
        return () => {
            made.end();
            observer.disconnect();
            forget();
        };
    }, []);
    useLayoutEffect(() => {
        drawing.current!.props = props;
        drawing.current!.touch();
    });
    const choose = () => {
        const channel = drawing.current?.chosen();
        if (channel) props.onChoose(channel);
    };
    const press = (event: KeyboardEvent) => {
        if (event.ctrlKey || event.altKey || event.metaKey) return;
        if (event.key === 'Enter') choose();
        else if (event.key === 'Escape') drawing.current!.leave();
        else if (!drawing.current!.press(event.key)) return;
        event.preventDefault();
    };
    return (
        <canvas
            class="spectrum-canvas"
            ref={props.canvas}
            tabIndex={0}
            role="application"
            aria-roledescription="spectrum"
            aria-label="Spectrum: channels by time"
            aria-describedby="spectrum-keys"
            onPointerMove={(event) => drawing.current!.point(event.offsetX, event.offsetY)}
            onPointerDown={(event) => drawing.current!.point(event.offsetX, event.offsetY)}
            onPointerLeave={() => drawing.current!.leave()}
            onClick={choose}
            onKeyDown={press}
            onBlur={() => drawing.current!.leave()}
        />
    );
}
