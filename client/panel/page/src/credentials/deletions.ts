import { notify } from '../app/notices';
import type { Service } from '../app/service';
import type { Credential } from '../app/state';
import { Store } from '../app/store';
import { carryOut, deletion } from './changes';
import { nameOf } from './words';

const UNDO_TIME = 8000;

/** By their ids, those that are to be deleted: no longer shown, and still stored. */
export const deleting = new Store<ReadonlyMap<number, Credential>>(new Map());

function forget(credential: Credential): void {
    deleting.update((all) => new Map([...all].filter(([id]) => id !== credential.Id)));
}

async function send(service: Service, credential: Credential): Promise<void> {
    const result = await carryOut(service, deletion(credential));
    forget(credential);
    if (!result.isDone) notify(result.why, { kind: 'failure' });
}

/**
 * Deletes it once nobody can want it back any more. Nothing could bring it back afterwards: the page never learns
 * the password, so that it could not add again what was deleted. So the command waits until the time to undo is
 * over, or the page is left.
 */
export function deleteLater(service: Service, credential: Credential): void {
    deleting.update((all) => new Map(all).set(credential.Id, credential));
    const leave = () => service.ask('hotspot', 'DELETE_CREDENTIAL', { Id: credential.Id });
    addEventListener('pagehide', leave);
    notify(`Deleted ${nameOf(credential)}`, {
        lasts: UNDO_TIME,
        action: {
            label: 'Undo',
            run: () => {
                removeEventListener('pagehide', leave);
                forget(credential);
            },
        },
        onExpired: () => {
            removeEventListener('pagehide', leave);
            void send(service, credential);
        },
    });
}
