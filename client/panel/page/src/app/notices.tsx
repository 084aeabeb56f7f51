import { useEffect } from 'preact/hooks';
import { Store, useStore } from './store';
import './notices.css';

export interface NoticeOptions {
    kind?: 'info' | 'failure';
    /** A button beside the text, such as "Undo". It takes the notice away. */
    action?: { label: string; run(): void };
    /** Milliseconds until it goes by itself. */
    lasts?: number;
    /** Called once when it has gone without its action. */
    onExpired?(): void;
}

interface Notice extends NoticeOptions {
    id: number;
    text: string;
}

const LASTS = 8000;
const MOST = 4;

export const notices = new Store<readonly Notice[]>([]);
const spoken = new Store('');
let lastId = 0;

function remove(id: number): Notice | undefined {
    const notice = notices.get().find((candidate) => candidate.id === id);
    notices.update((all) => all.filter((candidate) => candidate.id !== id));
    return notice;
}

function expire(id: number): void {
    remove(id)?.onExpired?.();
}

/** Tells the user something at the edge of the page. Returns what takes it away, which counts as expired. */
export function notify(text: string, options: NoticeOptions = {}): () => void {
    const id = ++lastId;
    notices.update((all) => [...all, { ...options, id, text }]);
    // One with an action stays its time: a click on it may be on the way.
    const oldest = notices.get().find((notice) => !notice.action && notice.id !== id);
    if (oldest && notices.get().length > MOST) expire(oldest.id);
    return () => expire(id);
}

/** Tells a screen reader something that is plain to see. */
export function announce(text: string): void {
    // The same text twice would not be read again.
    spoken.set(spoken.get() === text ? `${text}\u00a0` : text);
}

function NoticeBox({ notice }: { notice: Notice }) {
    useEffect(() => {
        const timer = setTimeout(() => expire(notice.id), notice.lasts ?? LASTS);
        return () => clearTimeout(timer);
    }, [notice]);
    const act = () => {
        remove(notice.id);
        notice.action?.run();
    };
    return (
        <div class={`notice ${notice.kind ?? 'info'}`}>
            <span class="notice-text">{notice.text}</span>
            {notice.action && (
                <button type="button" class="button small" onClick={act}>
                    {notice.action.label}
                </button>
            )}
            <button type="button" class="button small quiet" aria-label="Dismiss" onClick={() => expire(notice.id)}>
                Close
            </button>
        </div>
    );
}

/** Shows the notices, and holds what is announced. */
export function Notices() {
    const shown = useStore(notices, (all) => all);
    const text = useStore(spoken, (all) => all);
    return (
        <>
            <div class="notices" role="status" aria-live="polite">
                {shown.map((notice) => (
                    <NoticeBox key={notice.id} notice={notice} />
                ))}
            </div>
            <div class="unseen" aria-live="polite" aria-atomic="true">
                {text}
            </div>
        </>
    );
}
