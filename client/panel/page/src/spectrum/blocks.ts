// Where an access point would do best.

import { bandOf } from './channels';
import { signed } from './quantity';

export type Width = 20 | 40 | 80;

/** How a channel stood: levels, as the analyser tells them. */
export interface ChannelLoad {
    number: number;
    /** The mean congestion over the window. */
    mean: number;
    /** The congestion now; not a number where it is not known. */
    now: number;
    /** The mean interference over the window. */
    interference: number;
}

export interface Block {
    width: Width;
    /** The 20 MHz channels that an access point there is set to, the lowest first. */
    channels: number[];
    /** All listed channels that it overlaps. */
    covered: number[];
}

export interface RatedBlock extends Block {
    /** Of the channel that is worst off. */
    worst: number;
    worstChannel: number;
    mean: number;
    now: number;
    interference: number;
    /** What the choice goes by: lower is better. */
    cost: number;
}

const OVERLAP_2G = 2;
const APART_2G = 4;
const ALONE_2G = [1, 6, 11];
const FIRST_OF_5G_RUNS = [36, 100, 149];
const LAST_OF_5G_RUNS = [64, 144, 177];
const FIRST_WITH_RADAR = 52;
const LAST_WITH_RADAR = 144;

function covering(listed: readonly number[], first: number, last: number): number[] {
    return listed.filter((number) => number >= first - OVERLAP_2G && number <= last + OVERLAP_2G && number <= 14);
}

// Channels of 2.4 GHz lie closer than they are wide. 20 MHz: the three that leave each other alone. 40 MHz: two
// that are four apart. There is no room for 80.
function blocks2G(listed: readonly number[], width: Width): Block[] {
    const has = new Set(listed);
    if (width === 80) return [];
    if (width === 20)
        return ALONE_2G.filter((number) => has.has(number)).map((number) => ({
            width,
            channels: [number],
            covered: covering(listed, number, number),
        }));
    return listed
        .filter((number) => number <= 13 - APART_2G && has.has(number + APART_2G))
        .map((number) => ({
            width,
            channels: [number, number + APART_2G],
            covered: covering(listed, number, number + APART_2G),
        }));
}

// Those of 5 GHz stand side by side; a wider one begins at a multiple of its width within its run.
function blocks5G(listed: readonly number[], width: Width): Block[] {
    const has = new Set(listed);
    const size = width / 20;
    const found: Block[] = [];
    FIRST_OF_5G_RUNS.forEach((first, run) => {
        for (let begin = first; begin + 4 * (size - 1) <= LAST_OF_5G_RUNS[run]; begin += 4 * size) {
            const channels = Array.from({ length: size }, (_, i) => begin + 4 * i);
            if (channels.every((number) => has.has(number))) found.push({ width, channels, covered: channels });
        }
    });
    return found;
}

/** The blocks of a width that an adapter's channels have room for. */
export function blocksOf(listed: readonly number[], width: Width): Block[] {
    return [...blocks2G(listed, width), ...blocks5G(listed, width)];
}

// A block is as good as its worst channel, for all of it waits for that one; what is there now counts less than
// what was there on average. Interference decides between what is alike.
function rate(block: Block, loads: ReadonlyMap<number, ChannelLoad>): RatedBlock | null {
    const covered = block.covered.map((number) => loads.get(number));
    if (covered.some((load) => load === undefined || Number.isNaN(load.mean))) return null;
    const all = covered as ChannelLoad[];
    const average = (value: (load: ChannelLoad) => number) =>
        all.reduce((sum, load) => sum + value(load), 0) / all.length;
    const worst = all.reduce((a, b) => (b.mean > a.mean ? b : a));
    const mean = average((load) => load.mean);
    const now = Math.max(...all.map((load) => load.now));
    const expected = Number.isNaN(now) ? mean : now;
    const interference = average((load) => (Number.isNaN(load.interference) ? 0 : load.interference));
    const cost = 0.5 * worst.mean + 0.3 * mean + 0.2 * expected + 0.05 * interference;
    return { ...block, worst: worst.mean, worstChannel: worst.number, mean, now, interference, cost };
}

// Costs that lie so close to each other are alike: which is lower changes with every scan.
const GRADE = 4;

const grade = ({ cost }: RatedBlock) => Math.round(cost / GRADE);
const radar = (block: Block) => Number(needsRadarDetection(block));

/** The blocks of a width of which all is known, the best first; of equals one without radar, the lower channel. */
export function rankBlocks(loads: readonly ChannelLoad[], width: Width): RatedBlock[] {
    const byNumber = new Map(loads.map((load) => [load.number, load]));
    return blocksOf(
        [...byNumber.keys()].sort((a, b) => a - b),
        width,
    )
        .map((block) => rate(block, byNumber))
        .filter((block) => block !== null)
        .sort((a, b) => grade(a) - grade(b) || radar(a) - radar(b) || a.channels[0] - b.channels[0]);
}

/** `36`, `1 + 5` in 2.4 GHz, `36\u201348`. */
export function blockName({ channels }: Block): string {
    if (channels.length === 1) return String(channels[0]);
    if (bandOf(channels[0]) === '2.4 GHz') return channels.join(' + ');
    return `${channels[0]}\u2013${channels.at(-1)}`;
}

export function needsRadarDetection({ channels }: Block): boolean {
    return channels.some((number) => number >= FIRST_WITH_RADAR && number <= LAST_WITH_RADAR);
}

const percent = (level: number) => `${Math.round(level)}\u00a0%`;

/** Why the first of the ranked blocks is the best, in one sentence. */
export function reasonFor(ranked: readonly RatedBlock[]): string {
    const [best, next] = ranked;
    const level = `${signed(Math.round(best.interference) - 120)}\u00a0dBm`;
    const isNowKnown = !Number.isNaN(best.now);
    const parts =
        best.covered.length === 1
            ? `congestion was ${percent(best.mean)} on average${isNowKnown ? ` and is ${percent(best.now)} now` : ''}`
            : `its busiest channel, ${best.worstChannel}, was at ${percent(best.worst)} on average and all it covers at ` +
              `${percent(best.mean)}${isNowKnown ? `, now it is at most ${percent(best.now)}` : ''}`;
    const rival = next
        ? `; ${blockName(next)} comes next with ${percent(next.covered.length === 1 ? next.mean : next.worst)}`
        : '';
    const radar = needsRadarDetection(best) ? '; an access point has to leave it for radar' : '';
    return `On ${blockName(best)} ${parts}, interference ${level}${rival}${radar}.`;
}
