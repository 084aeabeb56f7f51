import { useCanCommand, useService, useServiceState } from '../app/service';

const WORDS: [boolean, string][] = [
    [true, 'On'],
    [false, 'Off'],
];

/** Whether the service looks for hotspots and joins them. */
export function HotspotSwitch() {
    const service = useService();
    const canCommand = useCanCommand();
    // Without one the service answers, and turns nothing.
    const hasAdapter = useServiceState((state) => state.adapter === true);
    const isOn = useServiceState((state) => state.hotspot);
    return (
        <div class="bar" role="group" aria-label="Hotspot networks" title="Off ends a connection to a hotspot">
            <span class="muted" aria-hidden="true">
                Hotspot networks
            </span>
            <span class="choices">
                {WORDS.map(([value, word]) => (
                    <button
                        key={word}
                        type="button"
                        class="button"
                        aria-pressed={isOn === value}
                        disabled={!canCommand || !hasAdapter}
                        onClick={() => service.ask('hotspot', 'SET_HOTSPOT_AUTO_CONNECT', value)}
                    >
                        {word}
                    </button>
                ))}
            </span>
        </div>
    );
}
