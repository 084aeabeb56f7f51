import { readHeader, RecordingIndex } from './RecordingIndex';

/** Tells how much of the bytes has been read. */
export type Progress = (bytes: number) => void;

const NO_RECORDING = 'It is no recording of vexa.';
const LONGEST_LINE = 64 << 20;
// One of these may unpack to a hundred times as much, in one go.
const PIECE = 16384;
// The page goes on after so many milliseconds; the time is looked at after so many lines.
const TURN = 12;
const LINES_OF_LOOK = 256;

const isGzip = (bytes: Uint8Array) => bytes[0] === 0x1f && bytes[1] === 0x8b;

/** Bytes in pieces; what breaks off is at its end there, as a recorder may have been killed. */
async function* piecesOf(stream: ReadableStream<Uint8Array<ArrayBuffer>>, progress: Progress, signal: AbortSignal) {
    let bytes = 0;
    const counted = stream.pipeThrough(
        new TransformStream<Uint8Array<ArrayBuffer>, Uint8Array<ArrayBuffer>>({
            transform(piece, controller) {
                bytes += piece.length;
                progress(bytes);
                for (let at = 0; at < piece.length; at += PIECE) controller.enqueue(piece.subarray(at, at + PIECE));
            },
        }),
        { signal },
    );
    const reader = counted.getReader();
    const first = await reader.read();
    if (first.done) return;
    const source = rest(first.value, reader);
    if (!isGzip(first.value)) {
        yield* iterate(source, signal);
        return;
    }
    yield* iterate(source.pipeThrough(new DecompressionStream('gzip')), signal, true);
}

/** The stream with the piece that was taken of it in front again. */
function rest(
    first: Uint8Array<ArrayBuffer>,
    reader: ReadableStreamDefaultReader<Uint8Array<ArrayBuffer>>,
): ReadableStream<Uint8Array<ArrayBuffer>> {
    return new ReadableStream({
        start: (controller) => controller.enqueue(first),
        async pull(controller) {
            const next = await reader.read();
            if (next.done) controller.close();
            else controller.enqueue(next.value);
        },
        cancel: (reason) => reader.cancel(reason),
    });
}

async function* iterate(stream: ReadableStream<Uint8Array>, signal: AbortSignal, mayBreak = false) {
    const reader = stream.getReader();
    try {
        for (;;) {
            signal.throwIfAborted();
            const { done, value } = await reader.read();
            if (done) return;
            yield value;
        }
    } catch (failure) {
        if (signal.aborted || !mayBreak) throw failure;
    }
}

/** Takes lines out of the pieces of a text. */
class Lines {
    #text = '';

    /** The whole lines that end with this piece. */
    *add(piece: string): Generator<string> {
        this.#text += piece;
        let begin = 0;
        for (let end = this.#text.indexOf('\n'); end >= 0; end = this.#text.indexOf('\n', begin)) {
            yield this.#text.slice(begin, end).replace(/\r$/, '');
            begin = end + 1;
        }
        this.#text = this.#text.slice(begin);
        if (this.#text.length > LONGEST_LINE) throw new Error(NO_RECORDING);
    }

    /** What is behind the last line end. */
    get remainder(): string {
        return this.#text;
    }
}

const nextTurn = () => new Promise<void>((resolve) => setTimeout(resolve));

/**
 * Reads a recording, compressed or not, in pieces between which the page goes on. One that was cut off ends with its
 * last whole line. Throws if it is none.
 */
export async function readRecording(
    stream: ReadableStream<Uint8Array<ArrayBuffer>>,
    progress: Progress,
    signal: AbortSignal,
): Promise<RecordingIndex> {
    const decoder = new TextDecoder();
    const lines = new Lines();
    let index: RecordingIndex | null = null;
    let count = 0;
    let turn = performance.now();
    for await (const piece of piecesOf(stream, progress, signal)) {
        for (const line of lines.add(decoder.decode(piece, { stream: true }))) {
            count++;
            if (index === null) index = begin(line);
            else if (!index.add(line)) throw new Error(`Line ${count} is no line of a recording.`);
            if (count % LINES_OF_LOOK !== 0 || performance.now() - turn < TURN) continue;
            await nextTurn();
            signal.throwIfAborted();
            turn = performance.now();
        }
    }
    if (lines.remainder !== '') {
        if (index === null) index = begin(lines.remainder);
        else index.add(lines.remainder);
    }
    if (index === null) throw new Error(NO_RECORDING);
    index.finish();
    return index;
}

function begin(line: string): RecordingIndex {
    const header = readHeader(line);
    if (!header) throw new Error(NO_RECORDING);
    return new RecordingIndex(header);
}
