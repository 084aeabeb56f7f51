import type { Channel } from '../app/state';
import { durationText } from '../app/text';
import { themeColour } from '../app/theme';
import { columnAt, groupChannels, placeGroups, type PlacedGroup } from './channels';
import { cssColour, LEVEL_COLOURS } from './colours';
import { figure, NONE, TOP_LEVEL, type Quantity } from './quantity';
import { ROWS } from './WaterfallRows';
import type { WaterfallImage } from './WaterfallImage';

/** A place in the picture: a channel, and a row of the waterfall counted from the newest; -1 is the bars of now. */
export interface Spot {
    column: number;
    age: number;
}

/** What the bars show, by column. */
export interface Bars {
    now: ArrayLike<number>;
    peak: ArrayLike<number>;
}

const LEFT = 58;
const RIGHT = 10;
const TOP = 10;
const BARS = 104;
const AXIS = 40;
const BOTTOM = 6;
const GAP = 12;
const FONT = 'system-ui, -apple-system, "Segoe UI", sans-serif';
// Of the page's own size.
const FONT_SHARE = 0.79;
const LABEL_WIDTH = 24;
const GRID_LEVELS = [0, 50, 100];
const TIME_MARKS = 4;

function themeColours() {
    const names = ['text', 'muted', 'line', 'line-strong', 'accent', 'surface', 'sunken'] as const;
    return Object.fromEntries(names.map((name) => [name, themeColour(`--${name}`)])) as Record<
        (typeof names)[number],
        string
    >;
}

/** The bars of now above the waterfall, on one axis of channels. Lengths are CSS pixels. */
export class SpectrumPicture {
    readonly #canvas: HTMLCanvasElement;
    readonly #context: CanvasRenderingContext2D;
    #groups: PlacedGroup[] = [];
    #channels: readonly Channel[] = [];
    #width = 0;
    #height = 0;
    #scale = 1;
    #fontSize = 11;
    #colours = themeColours();

    constructor(canvas: HTMLCanvasElement) {
        this.#canvas = canvas;
        this.#context = canvas.getContext('2d')!;
    }

    resize(width: number, height: number, scale: number): void {
        this.#width = width;
        this.#height = height;
        this.#scale = scale;
        this.#fontSize = FONT_SHARE * parseFloat(getComputedStyle(document.documentElement).fontSize);
        this.#canvas.width = Math.round(width * scale);
        this.#canvas.height = Math.round(height * scale);
        this.#place();
    }

    setChannels(channels: readonly Channel[]): void {
        this.#channels = channels;
        this.#place();
    }

    takeTheme(): void {
        this.#colours = themeColours();
    }

    /** Null beside the channels. */
    spotAt(x: number, y: number): Spot | null {
        const column = columnAt(this.#groups, x);
        if (column < 0 || y < TOP || y >= this.#height - BOTTOM) return null;
        const age = Math.floor(((y - this.#waterfallTop) / this.#waterfallHeight) * ROWS);
        return { column, age: Math.min(Math.max(age, -1), ROWS - 1) };
    }

    /** `newest` says when the first row of the waterfall was. */
    draw(image: WaterfallImage, bars: Bars, spot: Spot | null, newest: string): void {
        const context = this.#context;
        context.setTransform(this.#scale, 0, 0, this.#scale, 0, 0);
        context.clearRect(0, 0, this.#width, this.#height);
        context.font = `${this.#fontSize}px ${FONT}`;
        this.#drawGrounds();
        image.draw(context, this.#groups, this.#waterfallTop, this.#waterfallHeight);
        this.#drawScale(image.quantity);
        this.#drawBars(bars);
        this.#drawChannels();
        this.#drawTimes(image.rows.rowTime * ROWS, newest);
        if (spot) this.#drawSpot(spot);
    }

    get #waterfallTop(): number {
        return TOP + BARS + AXIS;
    }

    get #waterfallHeight(): number {
        return Math.max(1, this.#height - this.#waterfallTop - BOTTOM);
    }

    #place(): void {
        const gap = this.#width < 600 ? GAP / 2 : GAP;
        this.#groups = placeGroups(groupChannels(this.#channels), LEFT, this.#width - RIGHT, gap);
    }

    // What is not known shows the ground.
    #drawGrounds(): void {
        const context = this.#context;
        context.fillStyle = this.#colours.sunken;
        for (const { x, count, columnWidth } of this.#groups) {
            context.fillRect(x, TOP, count * columnWidth, BARS);
            context.fillRect(x, this.#waterfallTop, count * columnWidth, this.#waterfallHeight);
        }
    }

    #drawScale(quantity: Quantity): void {
        const context = this.#context;
        context.textAlign = 'right';
        context.textBaseline = 'middle';
        for (const level of GRID_LEVELS) {
            const y = Math.round(TOP + BARS - (level / TOP_LEVEL) * BARS);
            context.fillStyle = this.#colours.muted;
            context.fillText(figure(quantity, level), LEFT - 8, y);
            context.fillStyle = this.#colours.line;
            for (const { x, count, columnWidth } of this.#groups) context.fillRect(x, y, count * columnWidth, 1);
        }
    }

    #drawBars({ now, peak }: Bars): void {
        const context = this.#context;
        this.#eachColumn((column, x, width) => {
            const inset = Math.min(2, width * 0.12);
            const level = now[column];
            const bottom = TOP + BARS;
            if (level !== NONE && level !== undefined) {
                const height = (level / TOP_LEVEL) * BARS;
                context.fillStyle = cssColour(LEVEL_COLOURS[level]);
                context.fillRect(x + inset, bottom - height, width - 2 * inset, height);
                context.strokeStyle = this.#colours['line-strong'];
                context.lineWidth = 1;
                if (width > 6 && height > 2)
                    context.strokeRect(x + inset + 0.5, bottom - height + 0.5, width - 2 * inset - 1, height - 0.5);
            }
            if (peak[column] !== NONE && peak[column] !== undefined) {
                context.fillStyle = this.#colours.text;
                context.fillRect(
                    x + inset,
                    Math.round(bottom - (peak[column] / TOP_LEVEL) * BARS) - 1,
                    width - 2 * inset,
                    2,
                );
            }
        });
    }

    #drawChannels(): void {
        const context = this.#context;
        const top = TOP + BARS;
        context.textBaseline = 'top';
        this.#groups.forEach((group, place) => {
            context.textAlign = 'center';
            context.fillStyle = this.#colours.text;
            for (const { text, x } of this.#labels(group)) context.fillText(text, x, top + 5);
            if (place > 0 && this.#groups[place - 1].band === group.band) return;
            context.textAlign = 'left';
            context.fillStyle = this.#colours.muted;
            context.fillText(group.band, group.x, top + 21);
        });
        context.textAlign = 'right';
        context.fillStyle = this.#colours.muted;
        context.fillText('Channel', LEFT - 8, top + 5);
    }

    /** The first number of a group, and those behind it that have room before the next group's. */
    #labels({ first, count, x, columnWidth }: PlacedGroup): { text: string; x: number }[] {
        const labels: { text: string; x: number }[] = [];
        const overhang = Math.max(0, LABEL_WIDTH / 2 - columnWidth / 2 - GAP / 2);
        let free = -Infinity;
        for (let i = 0; i < count; i++) {
            const centre = x + (i + 0.5) * columnWidth;
            const hasRoom = centre - LABEL_WIDTH / 2 >= free;
            const fits = i === 0 || centre + LABEL_WIDTH / 2 <= x + count * columnWidth + GAP / 2 - overhang;
            if (!hasRoom || !fits) continue;
            labels.push({ text: String(this.#channels[first + i].number), x: centre });
            free = centre + LABEL_WIDTH / 2;
        }
        return labels;
    }

    #drawTimes(length: number, newest: string): void {
        const context = this.#context;
        context.textAlign = 'right';
        context.textBaseline = 'middle';
        context.fillStyle = this.#colours.muted;
        for (let mark = 0; mark <= TIME_MARKS; mark++) {
            const share = mark / TIME_MARKS;
            const y = this.#waterfallTop + share * this.#waterfallHeight;
            const text = mark === 0 ? newest : `\u2212${durationText(length * share)}`;
            context.fillText(text, LEFT - 8, Math.min(y, this.#height - BOTTOM - 6) + (mark === 0 ? 6 : 0));
        }
    }

    #drawSpot({ column, age }: Spot): void {
        const context = this.#context;
        this.#eachColumn((at, x, width) => {
            if (at !== column) return;
            context.strokeStyle = this.#colours.accent;
            context.lineWidth = 2;
            context.strokeRect(x, TOP, width, BARS);
            context.strokeRect(x, this.#waterfallTop, width, this.#waterfallHeight);
        });
        if (age < 0) return;
        const y = this.#waterfallTop + ((age + 0.5) / ROWS) * this.#waterfallHeight;
        context.fillStyle = this.#colours.accent;
        context.fillRect(LEFT - 6, y - 1, this.#width - LEFT - RIGHT + 6, 2);
    }

    #eachColumn(visit: (column: number, x: number, width: number) => void): void {
        for (const { first, count, x, columnWidth } of this.#groups) {
            for (let i = 0; i < count; i++) visit(first + i, x + i * columnWidth, columnWidth);
        }
    }
}
