import { useMemo, useState } from 'preact/hooks';
import { useCanCommand, useService, useServiceState } from '../app/service';
import type { Network, State } from '../app/state';
import { useStore } from '../app/store';
import { counted, printable } from '../app/text';
import { fittingCredentials } from '../credentials/matching';
import { NetworkRow } from './NetworkRow';
import { requests } from './requests';
import { storyOf } from './timeline';
import { quoted } from '../credentials/words';
import '../app/grid.css';
import './networks.css';

/** Why there is no network to show. */
function whyNone(state: State): string {
    if (state.networks === null && state.adapter !== false) return 'The service has not told its networks yet.';
    if (state.adapter === false) return 'No adapter is in.';
    if (state.radio === false) return 'The radio is off.';
    if (state.hotspot === false) return 'The hotspot switch is off: the tab Credentials has it.';
    return 'No hotspot network is in range.';
}

function matches(network: Network, filter: string): boolean {
    const texts = [network.name, ...network.realms.map((realm) => realm.name)];
    return texts.some((text) => printable(text).toLowerCase().includes(filter));
}

// The log grows by many lines a second; only an open row reads it.
function useStory(isWanted: boolean) {
    const lines = useServiceState((state) => (isWanted ? state.log.lines : null));
    const credentials = useServiceState((state) => state.credentials);
    return useMemo(() => {
        const names = new Map((credentials ?? []).map((one) => [one.Id, quoted(one.CredentialName)]));
        return lines && storyOf(lines, (id) => names.get(id) ?? `credential ${id}`);
    }, [lines, credentials]);
}

function AskForRealms() {
    const service = useService();
    const canCommand = useCanCommand();
    return (
        <button
            type="button"
            class="button"
            disabled={!canCommand}
            title="Ends the connection that there is"
            onClick={() => service.ask('hotspot', 'UPDATE_NETWORK_REALM')}
        >
            Ask for realms again
        </button>
    );
}

function Columns() {
    return (
        <div class="grid-row grid-head" role="row">
            <span role="columnheader">Network</span>
            <span role="columnheader">State</span>
            <span role="columnheader">Internet</span>
            <span role="columnheader">Realms</span>
            <span role="columnheader">Credentials that fit</span>
            <span role="columnheader">
                <span class="unseen">Actions</span>
            </span>
        </div>
    );
}

/** The networks in range. */
export function NetworksView() {
    const networks = useServiceState((state) => state.networks) ?? [];
    const credentials = useServiceState((state) => state.credentials);
    const none = useServiceState(whyNone);
    const canCommand = useCanCommand();
    const asked = useStore(requests, (all) => all);
    const [filter, setFilter] = useState('');
    const [isFitting, setFitting] = useState(false);
    const [open, setOpen] = useState<string | null>(null);
    const story = useStory(open !== null);

    const fitting = useMemo(
        () => new Map(networks.map((network) => [network.name, fittingCredentials(credentials ?? [], network)])),
        [networks, credentials],
    );
    const wanted = filter.trim().toLowerCase();
    const shown = networks.filter(
        (network) => matches(network, wanted) && (!isFitting || fitting.get(network.name)!.length > 0),
    );
    return (
        <section class="card networks">
            <div class="card-head">
                <h2>
                    Networks{' '}
                    <span class="muted count figures" role="status">
                        {shown.length === networks.length
                            ? counted(networks.length, 'network')
                            : `${shown.length} of ${counted(networks.length, 'network')}`}
                    </span>
                </h2>
                <label class="check">
                    <input type="checkbox" checked={isFitting} onChange={(event) => setFitting(event.currentTarget.checked)} />
                    With a credential that fits
                </label>
                <input
                    class="input filter"
                    type="search"
                    aria-label="Filter by name or realm"
                    placeholder="Name or realm"
                    value={filter}
                    onInput={(event) => setFilter(event.currentTarget.value)}
                />
                <AskForRealms />
            </div>
            {shown.length === 0 ? (
                <p class="empty">{networks.length === 0 ? none : 'No network is like that.'}</p>
            ) : (
                <div class="grid-table network-table" role="table" aria-label="Networks in range">
                    <Columns />
                    {shown.map((network) => (
                        <NetworkRow
                            key={network.name}
                            network={network}
                            fitting={fitting.get(network.name)!}
                            credentials={credentials ?? []}
                            request={asked.get(network.name) ?? null}
                            canCommand={canCommand}
                            story={open === network.name ? story : null}
                            isOpen={open === network.name}
                            onToggle={() => setOpen(open === network.name ? null : network.name)}
                        />
                    ))}
                </div>
            )}
        </section>
    );
}
