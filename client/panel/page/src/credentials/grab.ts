import type { RefObject } from 'preact';
import { useLayoutEffect, useState } from 'preact/hooks';
import { announce } from '../app/notices';
import type { Credential } from '../app/state';
import { moved } from './order';
import { nameOf } from './words';

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

type Move = (credential: Credential, place: number) => void;

/** The order is changed by keys on the handles, which stand in the table. */
export function useGrab(credentials: readonly Credential[], table: RefObject<HTMLElement | null>, onMove: Move) {
    const [grab, setGrab] = useState<Grab | null>(null);
    const last = credentials.length - 1;
    const placeOf = (id: number) => credentials.findIndex((one) => one.Id === id);
    const from = grab ? placeOf(grab.id) : -1;

    // A row that takes another place loses the focus on the way.
    useLayoutEffect(() => {
        if (grab) table.current?.querySelector<HTMLElement>(`[data-handle="${grab.id}"]`)?.focus();
    }, [grab]);

    const position = (place: number) => `position ${place + 1} of ${credentials.length}`;
    const take = (id: number) => {
        const place = placeOf(id);
        const name = nameOf(credentials[place]!);
        setGrab({ id, place });
        announce(`${name} grabbed at ${position(place)}. Arrows move it, Space drops it, Escape leaves it.`);
    };
    const release = (isDropped: boolean) => {
        setGrab(null);
        if (!grab || from < 0) return;
        const held = credentials[from]!;
        const name = nameOf(held);
        announce(isDropped ? `${name} dropped at ${position(grab.place)}.` : `${name} stays at ${position(from)}.`);
        if (isDropped && grab.place !== from) onMove(held, grab.place);
    };
    const press = (id: number, event: KeyboardEvent) => {
        const step = STEPS[event.key];
        const isTaking = event.key === ' ' || event.key === 'Enter';
        if (!isTaking && !(grab && (step || event.key === 'Escape'))) return;
        event.preventDefault();
        if (!grab) return take(id);
        if (!step) return release(isTaking);
        const place = step(grab.place, last);
        setGrab({ id, place });
        announce(position(place));
    };
    return {
        shown: grab && from >= 0 ? moved(credentials, from, Math.min(grab.place, last)) : credentials,
        held: grab?.id ?? null,
        press,
        leave: () => release(false),
    };
}
