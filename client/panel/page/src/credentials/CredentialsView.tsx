import { useMemo, useState } from 'preact/hooks';
import { announce, notify } from '../app/notices';
import { useCanCommand, useService, useServiceState } from '../app/service';
import type { Credential, State } from '../app/state';
import { useStore } from '../app/store';
import { counted } from '../app/text';
import { carryOut, move } from './changes';
import { CredentialDialog } from './CredentialDialog';
import { CredentialTable } from './CredentialTable';
import { deleteLater, deleting } from './deletions';
import { openAddition, openDialog } from './dialogs';
import { HotspotSwitch } from './HotspotSwitch';
import { networksByCredential } from './matching';
import { moved, positionData } from './order';
import { reload } from './reload';
import { nameOf } from './words';
import '../app/grid.css';
import './credentials.css';

/** Why there is no credential to show. */
function whyNone(state: State): string {
    if (state.credentials !== null) return 'None is stored. With one, the service joins the networks that take it.';
    if (state.adapter === false) return 'No adapter is in, and without one the service tells of no credentials.';
    return 'The service has not told its credentials yet.';
}

const idsOf = (credentials: readonly Credential[]) => credentials.map((one) => one.Id);

/** In the order of the ids; those that are not among them last, as they are. */
function inOrder(credentials: readonly Credential[], ids: readonly number[]): readonly Credential[] {
    const place = new Map(ids.map((id, i) => [id, i]));
    const of = (one: Credential) => place.get(one.Id) ?? ids.length;
    return [...credentials].sort((a, b) => of(a) - of(b));
}

/** The credentials as they are shown, and what moves one of them. */
function useOrder(): [readonly Credential[], (credential: Credential, place: number) => void] {
    const service = useService();
    const all = useServiceState((state) => state.credentials);
    const hidden = useStore(deleting, (ids) => ids);
    // The order that was asked for, until the service has told what came of it.
    const [asked, setAsked] = useState<readonly number[] | null>(null);
    const shown = useMemo(() => {
        const left = (all ?? []).filter((one) => !hidden.has(one.Id));
        return asked ? inOrder(left, asked) : left;
    }, [all, hidden, asked]);
    const moveTo = (credential: Credential, place: number) => {
        const ids = moved(idsOf(shown), idsOf(shown).indexOf(credential.Id), place);
        const { Order } = positionData(idsOf(all ?? []), ids, credential.Id);
        setAsked(ids);
        void carryOut(service, move(credential, Order)).then((result) => {
            setAsked(null);
            if (result.isDone) announce(`${nameOf(credential)} is in position ${place + 1} now.`);
            else notify(result.why, { kind: 'failure' });
        });
    };
    return [shown, moveTo];
}

/** The stored credentials. */
export function CredentialsView() {
    const service = useService();
    const canCommand = useCanCommand();
    const networks = useServiceState((state) => state.networks);
    const none = useServiceState(whyNone);
    const hasAdapter = useServiceState((state) => state.adapter !== false);
    const dialog = useStore(openDialog, (open) => open);
    const [credentials, moveTo] = useOrder();
    const taking = useMemo(() => networksByCredential(credentials, networks ?? []), [credentials, networks]);
    return (
        <section class="card credentials">
            <div class="card-head">
                <h2>
                    Credentials{' '}
                    <span class="muted count figures">{counted(credentials.length, 'credential')}, the first is tried first</span>
                </h2>
                <HotspotSwitch />
                <button
                    type="button"
                    class="button"
                    disabled={!canCommand || !hasAdapter}
                    title="Makes the service read its configuration file again"
                    onClick={() => void reload(service)}
                >
                    Reload
                </button>
                <button
                    type="button"
                    class="button primary"
                    disabled={!canCommand || !hasAdapter}
                    onClick={() => openAddition()}
                >
                    Add
                </button>
            </div>
            <p id="how-to-move" class="unseen">
                Space grabs it, the arrow keys move it, Space drops it, Escape leaves it where it was.
            </p>
            {credentials.length === 0 ? (
                <p class="empty">{none}</p>
            ) : (
                <CredentialTable
                    credentials={credentials}
                    taking={taking}
                    onMove={moveTo}
                    onDelete={(credential) => deleteLater(service, credential)}
                />
            )}
            {dialog && <CredentialDialog key={dialog.before?.Id ?? 0} open={dialog} />}
        </section>
    );
}
