import { gapAt, placeInGap } from './order';

const EDGE = 48;
const STEP = 12;

/** Scrolls the page while the pointer is near its upper or lower edge. Returns what ends that. */
function scrollAtEdges(y: () => number, onScroll: () => void): () => void {
    let frame = requestAnimationFrame(function look() {
        const direction = y() < EDGE ? -1 : y() > innerHeight - EDGE ? 1 : 0;
        if (direction !== 0) {
            scrollBy({ top: direction * STEP, behavior: 'instant' });
            onScroll();
        }
        frame = requestAnimationFrame(look);
    });
    return () => cancelAnimationFrame(frame);
}

/**
 * Lets a row follow the pointer that went down on its handle, and `line` show where it would fall. Nothing is drawn
 * anew meanwhile: the order changes when it is dropped.
 */
export function dragRow(
    down: PointerEvent,
    rows: readonly HTMLElement[],
    from: number,
    line: HTMLElement,
    onDrop: (place: number) => void,
): void {
    const handle = down.currentTarget as HTMLElement;
    const boxes = rows.map((row) => row.getBoundingClientRect());
    const middles = boxes.map((box) => box.top + box.height / 2 + scrollY);
    const edges = [...boxes.map((box) => box.top), boxes.at(-1)!.bottom].map((edge) => edge - boxes[0].top);
    const start = down.clientY + scrollY;
    let y = down.clientY;
    let gap = from;

    const show = () => {
        gap = gapAt(middles, y + scrollY);
        rows[from].style.transform = `translateY(${y + scrollY - start}px)`;
        line.style.top = `${rows[0].offsetTop + edges[gap]}px`;
        line.hidden = placeInGap(from, gap) === from;
    };
    const stopScrolling = scrollAtEdges(() => y, show);
    const over = new AbortController();
    const end = (isDropped: boolean) => {
        over.abort();
        stopScrolling();
        rows[from].style.transform = '';
        rows[from].classList.remove('dragged');
        line.hidden = true;
        const place = placeInGap(from, gap);
        if (isDropped && place !== from) onDrop(place);
    };
    const { signal } = over;
    handle.setPointerCapture(down.pointerId);
    rows[from].classList.add('dragged');
    handle.addEventListener('pointermove', (move) => ((y = move.clientY), show()), { signal });
    handle.addEventListener('pointerup', () => end(true), { signal });
    handle.addEventListener('pointercancel', () => end(false), { signal });
    addEventListener('keydown', (press) => press.key === 'Escape' && end(false), { signal });
}
