import { Column } from './Column';

const PIECE = 1 << 20;

/** Lines of text that are seldom read, and may be many: in blobs, which a browser keeps outside of the page. */
export class LineStore {
    readonly #blobs: Blob[] = [];
    readonly #blob = new Column(Uint16Array);
    readonly #offset = new Column(Uint32Array);
    readonly #length = new Column(Uint32Array);
    readonly #encoder = new TextEncoder();
    #pending: Uint8Array<ArrayBuffer>[] = [];
    #pendingBytes = 0;

    get count(): number {
        return this.#blob.length;
    }

    add(line: string): void {
        const bytes = this.#encoder.encode(line);
        this.#blob.push(this.#blobs.length);
        this.#offset.push(this.#pendingBytes);
        this.#length.push(bytes.length);
        this.#pending.push(bytes);
        this.#pendingBytes += bytes.length;
        if (this.#pendingBytes >= PIECE) this.seal();
    }

    /** To be called after the last line. */
    seal(): void {
        if (this.#pendingBytes === 0) return;
        this.#blobs.push(new Blob(this.#pending));
        this.#pending = [];
        this.#pendingBytes = 0;
    }

    read(index: number): Promise<string> {
        const offset = this.#offset.at(index);
        const blob = this.#blobs[this.#blob.at(index)];
        return blob.slice(offset, offset + this.#length.at(index)).text();
    }
}
