import { useLayoutEffect, useMemo, useRef, useState } from 'preact/hooks';
import { announce } from '../app/notices';
import { useCanCommand } from '../app/service';
import type { Credential, Network } from '../app/state';
import { CredentialRow, type RowActions } from './CredentialRow';
import { openEdit } from './dialogs';
import { dragRow } from './drag';
import { moved } from './order';
import { nameOf } from './words';

interface Props {
    credentials: readonly Credential[];
    taking: ReadonlyMap<number, readonly Network[]>;
    onMove(credential: Credential, place: number): void;
    onDelete(credential: Credential): void;
}

/** The one that is held by the keyboard, and where it would fall. */
interface Grab {
    id: number;
    place: number;
}

const STEPS: Record<string, (place: number, last: number) => number> = {
    ArrowUp: (place) => Math.max(place - 1, 0),
    ArrowDown: (place, last) => Math.min(place + 1, last),
    Home: () => 0,
    End: (_, last) => last,
};

/** The credentials in the order of priority, which is changed by their handles. */
export function CredentialTable({ credentials, taking, onMove, onDelete }: Props) {
    const canCommand = useCanCommand();
    const [grab, setGrab] = useState<Grab | null>(null);
    const table = useRef<HTMLDivElement>(null);
    const line = useRef<HTMLDivElement>(null);
    const from = grab ? credentials.findIndex((one) => one.Id === grab.id) : -1;
    const shown = grab && from >= 0 ? moved(credentials, from, Math.min(grab.place, credentials.length - 1)) : credentials;

    // A row that takes another place loses the focus on the way.
    useLayoutEffect(() => {
        if (grab) table.current?.querySelector<HTMLElement>(`[data-handle="${grab.id}"]`)?.focus();
    }, [grab]);

    const position = (place: number) => `position ${place + 1} of ${credentials.length}`;
    const find = (id: number) => credentials.find((one) => one.Id === id)!;
    const release = (isDropped: boolean) => {
        if (!grab || from < 0) return setGrab(null);
        const name = nameOf(find(grab.id));
        announce(isDropped ? `${name} dropped at ${position(grab.place)}.` : `${name} stays at ${position(from)}.`);
        if (isDropped && grab.place !== from) onMove(find(grab.id), grab.place);
        setGrab(null);
    };
    const press = (id: number, event: KeyboardEvent) => {
        const step = STEPS[event.key];
        if (event.key === ' ' || event.key === 'Enter') {
            event.preventDefault();
            if (grab) return release(true);
            const place = credentials.findIndex((one) => one.Id === id);
            setGrab({ id, place });
            announce(`${nameOf(find(id))} grabbed at ${position(place)}. Arrows move it, Space drops it, Escape leaves it.`);
        } else if (grab && event.key === 'Escape') {
            event.preventDefault();
            release(false);
        } else if (grab && step) {
            event.preventDefault();
            const place = step(grab.place, credentials.length - 1);
            setGrab({ id, place });
            announce(position(place));
        }
    };
    const point = (id: number, event: PointerEvent) => {
        if (event.button !== 0 || grab) return;
        const rows = [...table.current!.querySelectorAll<HTMLElement>('.credential')];
        const at = credentials.findIndex((one) => one.Id === id);
        dragRow(event, rows, at, line.current!, (place) => onMove(find(id), place));
    };

    // The rows keep what they are given first, so that an unchanged one is not drawn anew.
    const latest = useRef<RowActions>(null!);
    latest.current = {
        press,
        point,
        blur: (event) => event.relatedTarget && release(false),
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
            {shown.map((credential, place) => (
                <CredentialRow
                    key={credential.Id}
                    credential={credential}
                    place={place}
                    count={shown.length}
                    networks={taking.get(credential.Id) ?? null}
                    canCommand={canCommand}
                    isGrabbed={grab?.id === credential.Id}
                    actions={actions}
                />
            ))}
            <div class="drop-line" ref={line} hidden />
        </div>
    );
}
