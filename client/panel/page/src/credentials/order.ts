/** A list with one element at another place. */
export function moved<T>(list: readonly T[], from: number, to: number): T[] {
    const rest = [...list.slice(0, from), ...list.slice(from + 1)];
    return [...rest.slice(0, to), list[from], ...rest.slice(to)];
}

/**
 * The `Order` that brings a credential right in front of `next`, null: to the end. What is shown may be less than
 * what there is, so that its place there is not the place in the service's list.
 */
export function orderInFrontOf(ids: readonly number[], id: number, next: number | null): number {
    const others = ids.filter((other) => other !== id);
    const at = next === null ? -1 : others.indexOf(next);
    return at < 0 ? others.length : at;
}

/** The command's data that make the shown order of what it is, after one has been moved there. */
export function positionData(ids: readonly number[], shown: readonly number[], id: number): { Id: number; Order: number } {
    const next = shown[shown.indexOf(id) + 1] ?? null;
    return { Id: id, Order: orderInFrontOf(ids, id, next) };
}

/** Into which gap between rows a point falls: 0 above the middle of the first, as many as rows below that of the last. */
export function gapAt(middles: readonly number[], y: number): number {
    let low = 0;
    let high = middles.length;
    while (low < high) {
        const at = (low + high) >> 1;
        if (middles[at] < y) low = at + 1;
        else high = at;
    }
    return low;
}

/** Where the row at `from` comes to stand when it is dropped into a gap. */
export function placeInGap(from: number, gap: number): number {
    return gap > from ? gap - 1 : gap;
}
