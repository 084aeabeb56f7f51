import type { PlacedGroup } from './channels';
import { LEVEL_COLOURS } from './colours';
import { NONE, type Quantity } from './quantity';
import { ROWS, WaterfallRows } from './WaterfallRows';

/** The rows of a waterfall as a picture: a pixel for each channel and row, so that only new rows are painted. */
export class WaterfallImage {
    readonly rows: WaterfallRows;
    readonly quantity: Quantity;
    readonly #canvas = document.createElement('canvas');
    readonly #context: CanvasRenderingContext2D;
    readonly #row: ImageData;
    #painted = 0;

    constructor(rows: WaterfallRows, quantity: Quantity) {
        this.rows = rows;
        this.quantity = quantity;
        this.#canvas.width = Math.max(1, rows.columns);
        this.#canvas.height = ROWS;
        this.#context = this.#canvas.getContext('2d')!;
        this.#row = this.#context.createImageData(this.#canvas.width, 1);
        this.#paintFrom(rows.end - ROWS);
    }

    /** Takes in what is new. Tells whether there was something. */
    update(): boolean {
        this.rows.fill();
        return this.#paintFrom(this.#painted);
    }

    /** Draws all between two heights, the newest on top. */
    draw(context: CanvasRenderingContext2D, groups: readonly PlacedGroup[], top: number, height: number): void {
        const newest = WaterfallRows.slotOf(Math.max(0, this.rows.end - 1));
        const rowHeight = height / ROWS;
        context.imageSmoothingEnabled = false;
        for (const { first, count, x, columnWidth } of groups) {
            const width = count * columnWidth;
            const above = ROWS - newest;
            context.drawImage(this.#canvas, first, newest, count, above, x, top, width, above * rowHeight);
            if (newest > 0) {
                const y = top + above * rowHeight;
                context.drawImage(this.#canvas, first, 0, count, newest, x, y, width, newest * rowHeight);
            }
        }
    }

    #paintFrom(row: number): boolean {
        const { end, columns } = this.rows;
        if (columns === 0 || row >= end) return false;
        for (let next = Math.max(0, row, end - ROWS); next < end; next++) this.#paintRow(next);
        this.#painted = end;
        return true;
    }

    #paintRow(row: number): void {
        const pixels = this.#row.data;
        for (let column = 0; column < this.rows.columns; column++) {
            const level = this.rows.level(this.quantity, row, column);
            const at = column * 4;
            if (level === NONE) {
                pixels[at + 3] = 0;
                continue;
            }
            [pixels[at], pixels[at + 1], pixels[at + 2]] = LEVEL_COLOURS[level];
            pixels[at + 3] = 255;
        }
        this.#context.putImageData(this.#row, 0, WaterfallRows.slotOf(row));
    }
}
