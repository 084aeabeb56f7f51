import { useMemo, useRef } from 'preact/hooks';
import { useCanCommand } from '../app/service';
import type { Credential, Network } from '../app/state';
import { CredentialRow, type RowActions } from './CredentialRow';
import { openEdit } from './dialogs';
import { dragRow } from './drag';
import { useGrab } from './grab';

interface Props {
    credentials: readonly Credential[];
    taking: ReadonlyMap<number, readonly Network[]>;
    onMove(credential: Credential, place: number): void;
    onDelete(credential: Credential): void;
}

function Head() {
    return (
        <div class="grid-row grid-head" role="row">
            <span role="columnheader">
                <span class="unseen">Position</span>
            </span>
            <span role="columnheader">Name</span>
            <span role="columnheader">Realm</span>
            <span role="columnheader">Identity</span>
            <span role="columnheader">By itself</span>
            <span role="columnheader">Taken in range by</span>
            <span role="columnheader">
                <span class="unseen">Actions</span>
            </span>
        </div>
    );
}

/** The credentials in the order of priority, which is changed by their handles. */
export function CredentialTable({ credentials, taking, onMove, onDelete }: Props) {
    const canCommand = useCanCommand();
    const table = useRef<HTMLDivElement>(null);
    const line = useRef<HTMLDivElement>(null);
    const { shown, held, press, leave } = useGrab(credentials, table, onMove);

    const point = (id: number, event: PointerEvent) => {
        if (event.button !== 0 || held !== null) return;
        const rows = [...table.current!.querySelectorAll<HTMLElement>('.credential')];
        const at = credentials.findIndex((one) => one.Id === id);
        dragRow(event, rows, at, line.current!, (place) => onMove(credentials[at]!, place));
    };

    // The rows keep what they are given first, so that an unchanged one is not drawn anew.
    const latest = useRef<RowActions>(null!);
    latest.current = {
        press,
        point,
        blur: (event) => event.relatedTarget && leave(),
        edit: openEdit,
        delete: onDelete,
    };
    const actions = useMemo<RowActions>(
        () => ({
            press: (id, event) => latest.current.press(id, event),
            point: (id, event) => latest.current.point(id, event),
            blur: (event) => latest.current.blur(event),
            edit: (credential) => latest.current.edit(credential),
            delete: (credential) => latest.current.delete(credential),
        }),
        [],
    );
    return (
        <div class="grid-table credential-table" role="table" aria-label="Credentials in the order of priority" ref={table}>
            <Head />
            {shown.map((credential, place) => (
                <CredentialRow
                    key={credential.Id}
                    credential={credential}
                    place={place}
                    count={shown.length}
                    networks={taking.get(credential.Id) ?? null}
                    canCommand={canCommand}
                    isGrabbed={held === credential.Id}
                    actions={actions}
                />
            ))}
            <div class="drop-line" ref={line} hidden />
        </div>
    );
}
