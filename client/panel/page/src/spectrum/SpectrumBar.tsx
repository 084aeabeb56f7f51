import { useCanCommand, useServiceState } from '../app/service';
import type { Source } from '../app/source';
import { Store, useStore } from '../app/store';
import { Choices } from './Choices';
import { QUANTITIES, SCALES } from './quantity';
import { change, type Settings } from './settings';
import { WINDOWS } from './statistics';

// A value is seldom older while a scan runs.
const FRESH = 3000;
const NEVER = new Store(false);

const useIsScanning = (source: Source) => useStore(source.scan?.isOn ?? NEVER, (isOn) => isOn);

function ScanButton({ source }: { source: Source }) {
    const canCommand = useCanCommand();
    const isOn = useIsScanning(source);
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

/** Why values come, or do not. */
function useHint(source: Source, isPaused: boolean): string {
    const canCommand = useCanCommand();
    const isOn = useIsScanning(source);
    const adapter = useServiceState((state) => state.adapter);
    const radio = useServiceState((state) => state.radio);
    if (isPaused) return 'Paused; values are still taken in.';
    if (source.scan && !canCommand) return 'Waiting for the service.';
    if (adapter === false) return 'The adapter is out.';
    if (radio === false) return 'The radio is off.';
    if (source.spectrum.channels.length === 0) return 'The adapter has told no channels yet.';
    if (!source.scan) return '';
    const isTold = source.now() - source.spectrum.lastTold < FRESH;
    if (isOn && !isTold) return source.spectrum.told === 0 ? 'Scanning; no values yet.' : 'Scanning; nothing changes.';
    if (isOn) return 'Scanning.';
    return isTold ? 'Another client scans.' : 'No scan is running.';
}

interface Props {
    source: Source;
    settings: Settings;
    isPaused: boolean;
    onPause(): void;
}

/** What is scanned and how it is looked at. A recording is stopped where it is played. */
export function SpectrumBar({ source, settings, isPaused, onPause }: Props) {
    const hint = useHint(source, isPaused);
    return (
        <div class="bar spectrum-bar">
            {source.scan && <ScanButton source={source} />}
            {source.scan && (
                <button type="button" class="button" aria-pressed={isPaused} onClick={onPause}>
                    Pause
                </button>
            )}
            <Choices
                label="What is shown"
                choices={QUANTITIES.map((value) => ({ value, label: SCALES[value].name }))}
                chosen={settings.quantity}
                onChoose={(quantity) => change({ quantity })}
            />
            <Choices
                label="Time that is looked at"
                choices={WINDOWS.map((value) => ({ value, label: value.label }))}
                chosen={settings.window}
                onChoose={(window) => change({ window })}
            />
            {source.scan && (
                <button type="button" class="button" onClick={() => source.spectrum.clear()} disabled={isPaused}>
                    Clear
                </button>
            )}
            <span class="muted scan-hint" role="status">
                {hint}
            </span>
        </div>
    );
}
