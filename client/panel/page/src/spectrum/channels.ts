// Channels of the air: where they lie, and how they stand side by side in a picture.

import type { Channel } from '../app/state';

export type Band = '2.4 GHz' | '5 GHz';

const LAST_OF_2G = 14;

export function bandOf(channel: number): Band {
    return channel <= LAST_OF_2G ? '2.4 GHz' : '5 GHz';
}

/** The centre frequency in MHz. */
export function frequencyOf(channel: number): number {
    if (channel === LAST_OF_2G) return 2484;
    return channel < LAST_OF_2G ? 2407 + 5 * channel : 5000 + 5 * channel;
}

/** Channels without a gap between them, as columns of the list of all. */
export interface ChannelGroup {
    band: Band;
    first: number;
    count: number;
}

const WIDEST_STEP = 20;

/** The runs of neighbouring channels in a list that is sorted by number. */
export function groupChannels(channels: readonly Channel[]): ChannelGroup[] {
    const groups: ChannelGroup[] = [];
    channels.forEach(({ number }, column) => {
        const last = groups.at(-1);
        const before = column > 0 ? channels[column - 1].number : 0;
        const isNeighbour = last?.band === bandOf(number) && frequencyOf(number) - frequencyOf(before) <= WIDEST_STEP;
        if (last && isNeighbour) last.count++;
        else groups.push({ band: bandOf(number), first: column, count: 1 });
    });
    return groups;
}

/** Where each group lies between two edges, in the unit of these. */
export interface PlacedGroup extends ChannelGroup {
    x: number;
    columnWidth: number;
}

export function placeGroups(groups: readonly ChannelGroup[], left: number, right: number, gap: number): PlacedGroup[] {
    const count = groups.reduce((sum, group) => sum + group.count, 0);
    const columnWidth = Math.max(0, (right - left - gap * (groups.length - 1)) / Math.max(1, count));
    let x = left;
    return groups.map((group) => {
        const placed = { ...group, x, columnWidth };
        x += group.count * columnWidth + gap;
        return placed;
    });
}

/** The column at `x`; -1 between the groups and beside them. */
export function columnAt(groups: readonly PlacedGroup[], x: number): number {
    for (const { first, count, x: left, columnWidth } of groups) {
        if (x >= left && x < left + count * columnWidth) return first + Math.floor((x - left) / columnWidth);
    }
    return -1;
}
