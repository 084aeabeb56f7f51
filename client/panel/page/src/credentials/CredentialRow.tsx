import { Component } from 'preact';
import type { Credential, Network } from '../app/state';
import { printable } from '../app/text';
import { whyNeverTaken } from './matching';
import { identityOf, methodName, nameOf, quoted, THIS_USER } from './words';

/** What can be done to a row; the same object for all of them. */
export interface RowActions {
    press(id: number, event: KeyboardEvent): void;
    point(id: number, event: PointerEvent): void;
    blur(event: FocusEvent): void;
    edit(credential: Credential): void;
    delete(credential: Credential): void;
}

interface Props {
    credential: Credential;
    place: number;
    count: number;
    networks: readonly Network[] | null;
    canCommand: boolean;
    isGrabbed: boolean;
    actions: RowActions;
}

const MOST_NAMES = 3;

function sameCredential(a: Credential, b: Credential): boolean {
    return (Object.keys(a) as (keyof Credential)[]).every((member) => a[member] === b[member]);
}

const sameNames = (a: readonly Network[] | null, b: readonly Network[] | null) =>
    a?.length === b?.length && (a ?? []).every((network, i) => network.name === b![i].name);

function Taking({ credential, networks }: Props) {
    if (networks) {
        const names = networks.slice(0, MOST_NAMES).map((network) => quoted(network.name));
        const rest = networks.length - MOST_NAMES;
        const all = networks.map((network) => printable(network.name)).join('\n');
        return <span title={all}>{names.join(', ') + (rest > 0 ? ` and ${rest} more` : '')}</span>;
    }
    const why = whyNeverTaken(credential);
    return why ? <span class="warn">{why}</span> : <span class="muted">none in range</span>;
}

/** Drawn only when something of it changed. */
export class CredentialRow extends Component<Props> {
    override shouldComponentUpdate(next: Props): boolean {
        const { props } = this;
        return !(
            sameCredential(props.credential, next.credential) &&
            sameNames(props.networks, next.networks) &&
            props.place === next.place &&
            props.count === next.count &&
            props.canCommand === next.canCommand &&
            props.isGrabbed === next.isGrabbed
        );
    }

    override render() {
        const { credential, place, count, canCommand, isGrabbed, actions } = this.props;
        const id = credential.Id;
        return (
            <div class={`grid-row credential ${isGrabbed ? 'grabbed' : ''}`} role="row">
                <span role="cell" class="place">
                    <button
                        type="button"
                        class="handle"
                        data-handle={id}
                        disabled={!canCommand}
                        aria-pressed={isGrabbed}
                        aria-label={`Move ${nameOf(credential)}, position ${place + 1} of ${count}`}
                        aria-describedby="how-to-move"
                        onKeyDown={(event) => actions.press(id, event)}
                        onPointerDown={(event) => actions.point(id, event)}
                        onBlur={(event) => actions.blur(event)}
                    >
                        <span class="grip" aria-hidden="true" />
                        <span class="figures">{place + 1}</span>
                    </button>
                </span>
                <span role="rowheader" class="name">
                    {printable(credential.CredentialName)}
                    {credential.AccessType === THIS_USER && <span class="muted only-me"> this user only</span>}
                </span>
                <span role="cell" class="realm-cell" data-label="Realm">
                    {printable(credential.RealName) || <span class="muted">none</span>}{' '}
                    <span class="muted">{methodName(credential.CredentialEapMethod)}</span>
                </span>
                <span role="cell" class="identity" data-label="Identity">
                    {identityOf(credential) || <span class="muted">none</span>}
                </span>
                <span role="cell" class="by-itself" data-label="By itself">
                    {credential.AutoConnect ? 'yes' : <span class="muted">when asked</span>}
                </span>
                <span role="cell" class="taking" data-label="Taken by">
                    <Taking {...this.props} />
                </span>
                <span role="cell" class="acts">
                    <button
                        type="button"
                        class="button small"
                        disabled={!canCommand}
                        aria-label={`Edit ${nameOf(credential)}`}
                        onClick={() => actions.edit(credential)}
                    >
                        Edit
                    </button>
                    <button
                        type="button"
                        class="button small quiet"
                        disabled={!canCommand}
                        aria-label={`Delete ${nameOf(credential)}`}
                        onClick={() => actions.delete(credential)}
                    >
                        Delete
                    </button>
                </span>
            </div>
        );
    }
}
