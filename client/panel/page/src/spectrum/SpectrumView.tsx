import { useEffect, useMemo, useRef, useState } from 'preact/hooks';
import { useCanCommand, useServiceState } from '../app/service';
import type { Source } from '../app/source';
import { useStore, Store } from '../app/store';
import { BestChannel } from './BestChannel';
import { Choices } from './Choices';
import { scaleGradient } from './colours';
import { download, fileName, pictureOf } from './download';
import { spectrumText, type TextFormat } from './export';
import { busiest, loadsOf, takeFigures } from './figures';
import { figure, NONE, QUANTITIES, SCALES, TOP_LEVEL, type Quantity } from './quantity';
import { SpectrumCanvas } from './SpectrumCanvas';
import type { Bars } from './SpectrumPicture';
import { STEP } from './SpectrumHistory';
import { change, settings, toggled, type Settings } from './settings';
import { StatisticsTable } from './StatisticsTable';
import { WINDOWS } from './statistics';
import { TimeCourse } from './TimeCourse';
import './spectrum.css';

const LOOK = 500;
const FIRST_DRAWN = 3;
// After so many rows the busiest channels stay the ones that are drawn.
const SETTLED = 50;
const NEVER = new Store(false);

/** Counts up twice a second while `isRunning`. */
function useTicks(isRunning: boolean): number {
    const [ticks, setTicks] = useState(0);
    useEffect(() => {
        if (!isRunning) return undefined;
        const timer = setInterval(() => setTicks((count) => count + 1), LOOK);
        return () => clearInterval(timer);
    }, [isRunning]);
    return ticks;
}

function ScanButton({ source }: { source: Source }) {
    const canCommand = useCanCommand();
    const isOn = useStore(source.scan?.isOn ?? NEVER, (value) => value);
    const turn = () => (isOn ? source.scan?.stop() : source.scan?.start(source.now()));
    return (
        <button
            type="button"
            class={`button scan-button ${isOn ? '' : 'primary'}`}
            disabled={!canCommand}
            onClick={turn}
        >
            {isOn ? 'Stop scan' : 'Start scan'}
        </button>
    );
}

function Legend({ quantity }: { quantity: Quantity }) {
    const { name, unit } = SCALES[quantity];
    return (
        <div
            class="legend"
            role="img"
            aria-label={`${name}: dark is ${figure(quantity, 0)}, light is ${figure(quantity, TOP_LEVEL)} ${unit}`}
        >
            <span class="figures">{figure(quantity, 0)}</span>
            <span class="legend-scale" style={{ backgroundImage: scaleGradient() }} />
            <span class="figures">
                {figure(quantity, TOP_LEVEL)} {unit}
            </span>
        </div>
    );
}

interface ExportProps {
    source: Source;
    quantity: Quantity;
    length: number;
    end: number | null;
    canvas: { current: HTMLCanvasElement | null };
}

function ExportButtons({ source, quantity, length, end, canvas }: ExportProps) {
    const name = (ending: string) => fileName('spectrum', source.epoch + source.now(), ending);
    const save = (format: TextFormat, type: string) => {
        const text = spectrumText(source.spectrum, format, length, end ?? source.spectrum.endStep, source.epoch);
        download(name(format), new Blob(text, { type }));
    };
    const savePicture = async () => {
        const time = new Date(source.epoch + (end === null ? source.now() : end * STEP));
        const title = `${SCALES[quantity].name}, until ${time.toLocaleString('en-GB')}`;
        download(name('png'), await pictureOf(canvas.current!, quantity, title));
    };
    return (
        <div class="bar" role="group" aria-label="Save what is shown">
            <span class="muted">Save</span>
            <button type="button" class="button small" onClick={() => save('csv', 'text/csv')}>
                CSV
            </button>
            <button type="button" class="button small" onClick={() => save('jsonl', 'application/jsonl')}>
                JSON lines
            </button>
            <button type="button" class="button small" onClick={savePicture}>
                PNG
            </button>
        </div>
    );
}

/** What is to be told of the values that are, or are not, coming. */
function hintOf(source: Source, isOn: boolean, state: { adapter: boolean | null; radio: boolean | null }): string {
    if (state.adapter === false) return 'The adapter is out.';
    if (state.radio === false) return 'The radio is off.';
    if (source.spectrum.channels.length === 0) return 'The adapter has told no channels yet.';
    if (!source.scan) return '';
    const isTold = source.now() - source.spectrum.lastTold < 3000;
    if (isOn) return isTold ? 'Scanning.' : 'Scanning; no values yet.';
    return isTold ? 'Another client scans.' : 'No scan is running.';
}

/** The spectrum, now and over time. */
export function SpectrumView({ source }: { source: Source }) {
    const chosen = useStore(settings, (all): Settings => all);
    const { quantity, window, width } = chosen;
    const [pausedStep, setPausedStep] = useState<number | null>(null);
    const ticks = useTicks(pausedStep === null);
    const history = source.spectrum;
    const isOn = useStore(source.scan?.isOn ?? NEVER, (value) => value);
    const adapter = useServiceState((state) => state.adapter);
    const radio = useServiceState((state) => state.radio);
    const currentChannel = useServiceState((state) => state.currentChannel);
    const canvas = useRef<HTMLCanvasElement>(null);
    const readout = useRef<HTMLElement>(null);
    const figures = useMemo(
        () => takeFigures(history, window.length, pausedStep ?? undefined),
        [ticks, window, pausedStep, history, history.generation],
    );
    const drawn = chosen.drawn ?? busiest(history, figures, FIRST_DRAWN);
    const isSettled = history.endStep - history.firstStep > SETTLED && drawn.length > 0;
    useEffect(() => {
        if (isSettled && chosen.drawn === null) change({ drawn });
    }, [isSettled]);
    const onToggle = (channel: number) => change({ drawn: toggled(drawn, channel) });
    const label = window.length === Infinity ? 'the whole time' : window.label;

    const peaks = figures.window[quantity];
    const bars = (): Bars => {
        const now =
            pausedStep === null ? history.channels.map((_, i) => history.current(quantity, i)) : figures.now[quantity];
        const peak = now.map((level, i) => {
            const greatest = peaks[i]?.greatest ?? NONE;
            return greatest === NONE ? level : level === NONE ? greatest : Math.max(level, greatest);
        });
        return { now, peak };
    };

    return (
        <div class="spectrum">
            <div class="bar spectrum-bar">
                {source.scan && (
                    <>
                        <ScanButton source={source} />
                        <button
                            type="button"
                            class="button"
                            aria-pressed={pausedStep !== null}
                            onClick={() => setPausedStep(pausedStep === null ? history.endStep : null)}
                        >
                            Pause
                        </button>
                    </>
                )}
                <Choices
                    label="What is shown"
                    choices={QUANTITIES.map((value) => ({ value, label: SCALES[value].name }))}
                    chosen={quantity}
                    onChoose={(value) => change({ quantity: value })}
                />
                <Choices
                    label="Time that is looked at"
                    choices={WINDOWS.map((value) => ({ value, label: value.label }))}
                    chosen={window}
                    onChoose={(value) => change({ window: value })}
                />
                {source.scan && (
                    <button type="button" class="button" onClick={() => history.clear()} disabled={pausedStep !== null}>
                        Clear
                    </button>
                )}
                <span class="muted scan-hint" role="status">
                    {pausedStep === null
                        ? hintOf(source, isOn, { adapter, radio })
                        : 'Paused; values are still taken in.'}
                </span>
            </div>
            <section class="card waterfall" aria-labelledby="waterfall-title">
                <div class="card-head">
                    <h2 id="waterfall-title">Spectrum</h2>
                    <Legend quantity={quantity} />
                    <ExportButtons
                        source={source}
                        quantity={quantity}
                        length={window.length}
                        end={pausedStep}
                        canvas={canvas}
                    />
                </div>
                <p class="readout figures">
                    <span ref={readout} />
                </p>
                <SpectrumCanvas
                    source={source}
                    quantity={quantity}
                    length={window.length}
                    pausedStep={pausedStep}
                    bars={bars}
                    readout={readout}
                    onChoose={onToggle}
                    canvas={canvas}
                />
                <p class="note muted" id="spectrum-keys">
                    Bars: now, and the highest of {label}. Below: time, the newest on top. Arrow keys move, Enter or a
                    click draws the channel&apos;s curve.
                </p>
            </section>
            <section class="card course-card" aria-labelledby="course-title">
                <div class="card-head">
                    <h2 id="course-title">
                        {SCALES[quantity].name} over time, {SCALES[quantity].unit}
                    </h2>
                    <ul class="course-legend">
                        {drawn.map((number, place) => (
                            <li key={number}>
                                <span class={`swatch series-${place + 1}`} />
                                {number}
                            </li>
                        ))}
                    </ul>
                </div>
                <TimeCourse
                    source={source}
                    quantity={quantity}
                    length={window.length}
                    pausedStep={pausedStep}
                    channels={drawn}
                />
            </section>
            <BestChannel loads={loadsOf(history, figures)} width={width} label={label} />
            <StatisticsTable
                channels={history.channels}
                figures={figures}
                quantity={quantity}
                drawn={drawn}
                currentChannel={currentChannel}
                label={label}
                onToggle={onToggle}
            />
        </div>
    );
}
