import { useEffect, useRef } from 'preact/hooks';
import uPlot from 'uplot';
import 'uplot/dist/uPlot.min.css';
import type { Source } from '../app/source';
import { look, themeColour } from '../app/theme';
import { figure, NONE, SCALES, type Quantity } from './quantity';
import { STEP, type SpectrumHistory } from './SpectrumHistory';

const POINTS = 300;
const REDRAW = 250;
const HEIGHT = 184;
// As wide as what is beside the picture above.
const LEFT = 58;
const LONGEST = 600_000;
const DASHES = [[], [6, 3], [2, 3], [10, 3, 2, 3], [4, 4], [12, 4]];

/** The greatest levels of a channel in POINTS pieces of time; null where nothing is known. */
export function courseOf(
    history: SpectrumHistory,
    quantity: Quantity,
    column: number,
    steps: number,
    end: number,
): (number | null)[] {
    return Array.from({ length: POINTS }, (_, point) => {
        let greatest = -1;
        const begin = end - (POINTS - point) * steps;
        for (let step = begin; step < begin + steps; step++) {
            const level = history.level(quantity, step, column);
            if (level !== NONE && level > greatest) greatest = level;
        }
        return greatest < 0 ? null : greatest;
    });
}

interface Props {
    source: Source;
    quantity: Quantity;
    length: number;
    pausedStep: number | null;
    channels: readonly number[];
}

function dataOf({ source, quantity, length, pausedStep, channels }: Props): uPlot.AlignedData {
    const history = source.spectrum;
    const steps = Math.min(length, LONGEST) / STEP / POINTS;
    // Whole pieces, lest the curve trembles.
    const end = Math.floor((pausedStep ?? history.endStep) / steps) * steps;
    const times = Array.from(
        { length: POINTS },
        (_, point) => (source.epoch + (end - (POINTS - 1 - point) * steps) * STEP) / 1000,
    );
    const columns = channels.map((number) => history.channels.findIndex((channel) => channel.number === number));
    return [times, ...columns.map((column) => courseOf(history, quantity, column, steps, end))];
}

function axis(): uPlot.Axis {
    const line = themeColour('--line');
    return {
        stroke: themeColour('--muted'),
        font: '11px system-ui, sans-serif',
        grid: { stroke: line, width: 1 },
        ticks: { stroke: line, width: 1, size: 4 },
    };
}

function plotOptions(quantity: Quantity, channels: readonly number[], width: number): uPlot.Options {
    return {
        width,
        height: HEIGHT,
        legend: { show: false },
        cursor: { show: false },
        padding: [10, 10, 0, 0],
        scales: { y: { range: [0, 100] } },
        axes: [
            {
                ...axis(),
                size: 30,
                values: (_, ticks) => ticks.map((tick) => new Date(tick * 1000).toLocaleTimeString('en-GB')),
                space: 90,
            },
            {
                ...axis(),
                size: LEFT,
                splits: () => [0, 25, 50, 75, 100],
                values: (_, levels) => levels.map((level) => figure(quantity, level)),
            },
        ],
        series: [
            {},
            ...channels.map((number, place) => ({
                label: `Channel ${number}`,
                stroke: themeColour(`--series-${place + 1}`),
                dash: DASHES[place],
                width: 1.75,
                points: { show: false },
            })),
        ],
    };
}

function Plot(props: Props) {
    const { quantity, channels, length, pausedStep, source } = props;
    const box = useRef<HTMLDivElement>(null);
    const latest = useRef(props);
    latest.current = props;
    useEffect(() => {
        const element = box.current!;
        let plot: uPlot | null = null;
        const make = () => {
            plot?.destroy();
            plot = new uPlot(plotOptions(quantity, channels, element.clientWidth), dataOf(latest.current), element);
        };
        const observer = new ResizeObserver(() => plot?.setSize({ width: element.clientWidth, height: HEIGHT }));
        make();
        observer.observe(element);
        const forget = look.subscribe(make);
        const timer = pausedStep === null ? setInterval(() => plot?.setData(dataOf(latest.current)), REDRAW) : 0;
        return () => {
            clearInterval(timer);
            forget();
            observer.disconnect();
            plot?.destroy();
        };
    }, [quantity, channels.join(), length, pausedStep, source]);
    const names = channels.length > 0 ? `channels ${channels.join(', ')}` : 'no channel';
    return <div class="course" ref={box} role="img" aria-label={`${SCALES[quantity].name} over time: ${names}`} />;
}

/** The levels of some channels over time. */
export function TimeCourse(props: Props) {
    const { name, unit } = SCALES[props.quantity];
    return (
        <section class="card course-card" aria-labelledby="course-title">
            <div class="card-head">
                <h2 id="course-title">
                    {name} over time, {unit}
                </h2>
                <ul class="course-legend" aria-label="Channels that are drawn">
                    {props.channels.map((number, place) => (
                        <li key={number}>
                            <span class={`swatch series-${place + 1}`} />
                            {number}
                        </li>
                    ))}
                </ul>
            </div>
            <Plot {...props} />
        </section>
    );
}
