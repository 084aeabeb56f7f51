import type { ServiceEvent } from '../app/protocol';

/** What the spectral analyser told, over time. */
export class SpectrumHistory {
    take(_event: ServiceEvent): void {}
}
