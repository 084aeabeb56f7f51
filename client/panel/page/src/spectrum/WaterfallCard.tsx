import { useRef } from 'preact/hooks';
import type { Source } from '../app/source';
import { scaleGradient } from './colours';
import { figure, SCALES, TOP_LEVEL, type Quantity } from './quantity';
import { SaveButtons } from './SaveButtons';
import { SpectrumCanvas } from './SpectrumCanvas';
import type { Bars } from './SpectrumPicture';

function Legend({ quantity }: { quantity: Quantity }) {
    const { name, unit } = SCALES[quantity];
    const least = figure(quantity, 0);
    const greatest = `${figure(quantity, TOP_LEVEL)}\u00a0${unit}`;
    return (
        <div class="legend" role="img" aria-label={`${name}: dark is ${least}, light is ${greatest}`}>
            <span class="figures">{least}</span>
            <span class="legend-scale" style={{ backgroundImage: scaleGradient() }} />
            <span class="figures">{greatest}</span>
        </div>
    );
}

interface Props {
    source: Source;
    quantity: Quantity;
    /** The time that is looked at: milliseconds, and in words. */
    length: number;
    label: string;
    pausedStep: number | null;
    bars(): Bars;
    onChoose(channel: number): void;
}

/** The picture of the spectrum with its legend, and what it reads where one points. */
export function WaterfallCard({ label, ...shown }: Props) {
    const canvas = useRef<HTMLCanvasElement>(null);
    const readout = useRef<HTMLElement>(null);
    const { source, quantity, length, pausedStep } = shown;
    return (
        <section class="card waterfall" aria-labelledby="waterfall-title">
            <div class="card-head">
                <h2 id="waterfall-title">Spectrum</h2>
                <Legend quantity={quantity} />
                <SaveButtons source={source} quantity={quantity} length={length} end={pausedStep} canvas={canvas} />
            </div>
            <p class="readout figures">
                <span ref={readout} />
            </p>
            <SpectrumCanvas {...shown} readout={readout} canvas={canvas} />
            <p class="note muted" id="spectrum-keys">
                Bars: now, and the highest of {label}. Below: time, the newest on top. Arrow keys move, Enter or a click
                draws the channel&apos;s curve.
            </p>
        </section>
    );
}
