import { useEffect, useMemo, useState } from 'preact/hooks';
import { useServiceState } from '../app/service';
import type { Source } from '../app/source';
import { useStore } from '../app/store';
import { BestChannel } from './BestChannel';
import { barsOf, busiest, loadsOf, takeFigures, type Figures } from './figures';
import { change, settings, toggled, type Settings } from './settings';
import { SpectrumBar } from './SpectrumBar';
import type { SpectrumHistory } from './SpectrumHistory';
import { StatisticsTable } from './StatisticsTable';
import { TimeCourse } from './TimeCourse';
import { WaterfallCard } from './WaterfallCard';
import './spectrum.css';

const LOOK = 500;
const FIRST_DRAWN = 3;
// After so many rows the busiest channels stay the ones that are drawn.
const SETTLED = 50;

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

/** The channels whose curves are drawn: the chosen ones, or those that were busiest at the beginning. */
function useDrawn(history: SpectrumHistory, figures: Figures, chosen: Settings['drawn']): readonly number[] {
    const drawn = chosen ?? busiest(history, figures, FIRST_DRAWN);
    const isSettled = history.endStep - history.firstStep > SETTLED && drawn.length > 0;
    useEffect(() => {
        if (isSettled && chosen === null) change({ drawn });
    }, [isSettled]);
    return drawn.filter((number) => history.channels.some((channel) => channel.number === number));
}

/** The spectrum, now and over time. */
export function SpectrumView({ source }: { source: Source }) {
    const chosen = useStore(settings, (all): Settings => all);
    const { quantity, window, width } = chosen;
    const [pausedStep, setPausedStep] = useState<number | null>(null);
    const ticks = useTicks(pausedStep === null);
    const history = source.spectrum;
    const currentChannel = useServiceState((state) => state.currentChannel);
    const figures = useMemo(
        () => takeFigures(history, window.length, pausedStep),
        [ticks, window, pausedStep, history, history.generation],
    );
    const drawn = useDrawn(history, figures, chosen.drawn);
    const onToggle = (channel: number) => change({ drawn: toggled(drawn, channel) });
    const label = window.length === Infinity ? 'the whole time' : window.label;
    const shown = { source, quantity, length: window.length, pausedStep };
    return (
        <div class="spectrum">
            <SpectrumBar
                source={source}
                settings={chosen}
                isPaused={pausedStep !== null}
                onPause={() => setPausedStep(pausedStep === null ? history.endStep : null)}
            />
            <WaterfallCard
                {...shown}
                label={label}
                bars={() => barsOf(history, figures, quantity, pausedStep !== null)}
                onChoose={onToggle}
            />
            <TimeCourse {...shown} channels={drawn} />
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
