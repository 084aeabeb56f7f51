import type { Credential } from '../app/state';
import { Store } from '../app/store';
import { EMPTY, formOf } from './form';

/** What is being added, `before` null, or edited. */
export interface OpenDialog {
    before: Credential | null;
    form: Credential;
}

export const openDialog = new Store<OpenDialog | null>(null);

/** Goes to the credentials and opens the dialog for a new one, with what is known of it. */
export function openAddition(known: Partial<Credential> = {}): void {
    openDialog.set({ before: null, form: { ...EMPTY, ...known } });
    location.hash = 'credentials';
}

export function openEdit(credential: Credential): void {
    openDialog.set({ before: credential, form: formOf(credential) });
}

export function closeDialog(): void {
    openDialog.set(null);
}
