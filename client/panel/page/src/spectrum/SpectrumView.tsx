import type { Source } from '../app/source';

/** The spectrum, now and over time. */
export function SpectrumView(_: { source: Source }) {
    return <h2>Spectrum</h2>;
}
