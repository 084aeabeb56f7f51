const BLOCK = 16384;

type Numbers = Uint8Array | Uint16Array | Uint32Array;

/** Numbers of one kind that become ever more: kept in blocks, so that none is copied as it grows. */
export class Column<T extends Numbers> {
    length = 0;
    readonly #blocks: T[] = [];
    readonly #make: new (length: number) => T;

    constructor(make: new (length: number) => T) {
        this.#make = make;
    }

    push(value: number): void {
        const at = this.length % BLOCK;
        if (at === 0) this.#blocks.push(new this.#make(BLOCK));
        this.#blocks[this.#blocks.length - 1][at] = value;
        this.length++;
    }

    at(index: number): number {
        return this.#blocks[Math.floor(index / BLOCK)][index % BLOCK];
    }

    /** The first place with a number above `value`, in a column that rises. */
    firstAbove(value: number): number {
        let low = 0;
        let high = this.length;
        while (low < high) {
            const middle = (low + high) >>> 1;
            if (this.at(middle) > value) high = middle;
            else low = middle + 1;
        }
        return low;
    }
}
