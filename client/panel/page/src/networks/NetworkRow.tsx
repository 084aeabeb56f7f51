import { Component } from 'preact';
import { useService } from '../app/service';
import type { Credential, Network } from '../app/state';
import { printable } from '../app/text';
import { methodName, nameOf } from '../credentials/words';
import { NetworkDetails } from './NetworkDetails';
import { join, leave, type Request } from './requests';
import type { LogStory } from './timeline';

interface Props {
    network: Network;
    fitting: readonly Credential[];
    credentials: readonly Credential[];
    request: Request | null;
    canCommand: boolean;
    story: LogStory | null;
    isOpen: boolean;
    onToggle(): void;
}

const MOST_REALMS = 2;

function sameNetwork(a: Network, b: Network): boolean {
    return (
        a.isConnected === b.isConnected &&
        a.hasInternet === b.hasInternet &&
        a.realmsKnown === b.realmsKnown &&
        a.realms.length === b.realms.length &&
        a.realms.every((realm, i) => realm.name === b.realms[i].name && realm.method === b.realms[i].method)
    );
}

const sameFitting = (a: readonly Credential[], b: readonly Credential[]) =>
    a.length === b.length && a.every((one, i) => one.Id === b[i].Id && one.CredentialName === b[i].CredentialName);

function stateOf({ network, request }: Props): { text: string; mood: string } {
    if (request?.state === 'joining') return { text: 'Joining…', mood: 'busy' };
    if (request?.state === 'leaving') return { text: 'Leaving…', mood: 'busy' };
    if (network.isConnected) return { text: 'Connected', mood: 'good' };
    if (request?.state === 'failed') return { text: 'Not joined', mood: 'bad' };
    return { text: '–', mood: 'off' };
}

const internetOf = ({ isConnected, hasInternet }: Network) =>
    isConnected ? (hasInternet ? 'reached' : 'not reached') : hasInternet ? 'offered' : 'none';

function Realms({ network }: { network: Network }) {
    if (!network.realmsKnown) return <span class="muted">not known yet</span>;
    if (network.realms.length === 0) return <span class="muted">none</span>;
    const rest = network.realms.length - MOST_REALMS;
    return (
        <>
            {network.realms.slice(0, MOST_REALMS).map((realm) => (
                <span key={`${realm.name} ${realm.method}`} class="realm">
                    {printable(realm.name)} <span class="muted">{methodName(realm.method)}</span>
                </span>
            ))}
            {rest > 0 && <span class="muted">and {rest} more</span>}
        </>
    );
}

function JoinButton({ network, request, canCommand }: Props) {
    const service = useService();
    const isBusy = request?.state === 'joining' || request?.state === 'leaving';
    const isLeave = network.isConnected || request?.state === 'joining';
    return (
        <button
            type="button"
            class="button small"
            disabled={!canCommand || (isBusy && !isLeave) || request?.state === 'leaving'}
            aria-label={`${isLeave ? 'Leave' : 'Join'} ${printable(network.name)}`}
            onClick={() => void (isLeave ? leave : join)(service, network)}
        >
            {isLeave ? 'Leave' : 'Join'}
        </button>
    );
}

/** A network, and when it is open what there is to say of it. Drawn only when something of it changed. */
export class NetworkRow extends Component<Props> {
    override shouldComponentUpdate(next: Props): boolean {
        const { props } = this;
        return !(
            sameNetwork(props.network, next.network) &&
            sameFitting(props.fitting, next.fitting) &&
            props.request === next.request &&
            props.canCommand === next.canCommand &&
            props.story === next.story &&
            props.isOpen === next.isOpen &&
            !next.isOpen
        );
    }

    override render() {
        const { network, fitting, credentials, story, request, isOpen, onToggle } = this.props;
        const { text, mood } = stateOf(this.props);
        const shownName = printable(network.name);
        return (
            <>
                <div class={`grid-row ${network.isConnected ? 'is-connected' : ''}`} role="row">
                    <span role="rowheader" class="name">
                        {shownName}
                    </span>
                    <span role="cell" class={`state ${mood}`} title={request?.text}>
                        {text}
                    </span>
                    <span role="cell" class="internet" data-label="Internet">
                        {internetOf(network)}
                    </span>
                    <span role="cell" class="realms" data-label="Realms">
                        <Realms network={network} />
                    </span>
                    <span role="cell" class="fitting" data-label="Fits">
                        {fitting.length > 0 ? fitting.map(nameOf).join(', ') : <span class="muted">none</span>}
                    </span>
                    <span role="cell" class="acts">
                        <JoinButton {...this.props} />
                        <button
                            type="button"
                            class="button small quiet"
                            aria-expanded={isOpen}
                            aria-label={`Details of ${shownName}`}
                            onClick={onToggle}
                        >
                            Details
                        </button>
                    </span>
                </div>
                {isOpen && (
                    <div class="grid-row details" role="row">
                        <div role="cell" aria-colspan={6}>
                            <NetworkDetails network={network} fitting={fitting} credentials={credentials} story={story} request={request} />
                        </div>
                    </div>
                )}
            </>
        );
    }
}
