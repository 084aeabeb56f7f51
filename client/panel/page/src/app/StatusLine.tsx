import { useServiceState, type Service } from './service';
import { INITIAL_STATE, type State } from './state';
import { useStore } from './store';
import { durationText, printable } from './text';
import './status.css';

const UNKNOWN = 'not known';

type Mood = 'good' | 'bad' | 'off' | 'unknown';

interface Item {
    label: string;
    value: string;
    mood: Mood;
}

function flag(label: string, value: boolean | null, yes: string, no: string): Item {
    if (value === null) return { label, value: UNKNOWN, mood: 'unknown' };
    return { label, value: value ? yes : no, mood: value ? 'good' : 'off' };
}

function serviceItem(state: State, isLive: boolean): Item {
    const label = 'Service';
    if (!isLive) return { label, value: 'recorded', mood: 'unknown' };
    if (state.link === 'connecting') return { label, value: 'connecting', mood: 'unknown' };
    if (state.link === 'lost') return { label, value: 'panel lost, reconnecting', mood: 'bad' };
    if (state.running === null) return { label, value: UNKNOWN, mood: 'unknown' };
    return state.running
        ? { label, value: 'running', mood: 'good' }
        : { label, value: 'lost, looking for it', mood: 'bad' };
}

function connectionItem({ networks, internet, currentChannel }: State): Item {
    const label = 'Connection';
    if (networks === null) return { label, value: UNKNOWN, mood: 'unknown' };
    const connected = networks.find((network) => network.isConnected);
    if (!connected) return { label, value: 'none', mood: 'off' };
    const parts = [printable(connected.name)];
    if (currentChannel) parts.push(`channel ${currentChannel}`);
    parts.push(internet ? 'internet' : 'no internet');
    return { label, value: parts.join(' · '), mood: 'good' };
}

/** What the status line says of a state. Without the panel nobody knows how things stand now. */
export function statusItems(told: State, isLive: boolean): Item[] {
    const state = isLive && told.link === 'lost' ? { ...INITIAL_STATE, link: told.link } : told;
    return [
        serviceItem(state, isLive),
        flag('Adapter', state.adapter, 'in', 'out'),
        flag('Radio', state.radio, 'on', 'off'),
        flag('Hotspot', state.hotspot, 'on', 'off'),
        connectionItem(state),
    ];
}

// A dash takes no more room than what comes in its place.
function Unknown() {
    return (
        <>
            <span aria-hidden="true">&ndash;</span>
            <span class="unseen">{UNKNOWN}</span>
        </>
    );
}

/** How things stand, in one line; a change is read out. What is recorded is the live service, whatever is shown. */
export function StatusLine({ live, isLive }: { live: Service; isLive: boolean }) {
    const state = useServiceState((all) => all);
    const recording = useStore(live.state, ({ link, recording }) => (link === 'open' ? recording : null));
    return (
        <div class="status">
            <div class="status-told" role="status" aria-label="Status">
                <dl class="status-items">
                    {statusItems(state, isLive).map(({ label, value, mood }) => (
                        <div key={label} class={`status-item ${mood} is-${label.toLowerCase()}`}>
                            <dt>{label}</dt>
                            <dd title={value}>{value === UNKNOWN ? <Unknown /> : value}</dd>
                        </div>
                    ))}
                </dl>
            </div>
            {recording?.active && (
                <div class="status-item bad is-recording">
                    <span class="status-label">Recording</span>{' '}
                    <span class="figures">{durationText(recording.elapsed)}</span>
                </div>
            )}
        </div>
    );
}
