import { announce, notify } from '../app/notices';
import { shownSource } from '../app/source';
import { Store } from '../app/store';
import { Player } from './Player';
import { readRecording } from './readRecording';

/** A recording that is being read. */
export interface Reading {
    name: string;
    /** From 0 to 1; null if it can't be told. */
    share: number | null;
    cancel(): void;
}

export const reading = new Store<Reading | null>(null);

/** The recording that is shown in place of the service. */
export const player = new Store<Player | null>(null);

async function read(
    name: string,
    open: (signal: AbortSignal) => Promise<[ReadableStream<Uint8Array<ArrayBuffer>>, number]>,
) {
    reading.get()?.cancel();
    const abort = new AbortController();
    const mine: Reading = { name, share: null, cancel: () => abort.abort() };
    reading.set(mine);
    try {
        const [stream, size] = await open(abort.signal);
        const progress = (bytes: number) => {
            if (size > 0 && !abort.signal.aborted) reading.set({ ...mine, share: bytes / size });
        };
        show(new Player(name, await readRecording(stream, progress, abort.signal)));
    } catch (failure) {
        if (abort.signal.aborted) return;
        notify(`${name} can't be played. ${failure instanceof Error ? failure.message : ''}`, { kind: 'failure' });
    } finally {
        if (reading.get()?.cancel === mine.cancel) reading.set(null);
    }
}

/** Reads a file of the user's, and shows it. */
export function openFile(file: File): void {
    void read(file.name, async () => [file.stream(), file.size]);
}

/** Reads a recording of the relay's, and shows it. */
export function openRecording(name: string): void {
    void read(name, async (signal) => {
        const answer = await fetch(`/recordings/${encodeURIComponent(name)}`, { signal });
        if (!answer.ok || !answer.body) throw new Error('The panel does not give it.');
        return [answer.body, Number(answer.headers.get('Content-Length'))];
    });
}

function show(next: Player): void {
    player.get()?.pause();
    player.set(next);
    shownSource.set(next.source);
    next.play();
    announce(`Playing ${next.name}`);
}

/** Shows the service again. */
export function closeRecording(): void {
    player.get()?.pause();
    player.set(null);
    shownSource.set(null);
    announce('Showing the service');
}
