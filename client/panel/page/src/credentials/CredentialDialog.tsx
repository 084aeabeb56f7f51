import type { ComponentChildren } from 'preact';
import { useEffect, useRef, useState } from 'preact/hooks';
import { announce } from '../app/notices';
import { useCanCommand, useService, useServiceState } from '../app/service';
import type { Credential } from '../app/state';
import { addition, carryOut, edit } from './changes';
import { Choice, TextField } from './CredentialFields';
import { closeDialog, type OpenDialog } from './dialogs';
import { fieldsOf, objectionsTo, wantedOf, type Objections } from './form';
import { ALL_USERS, nameOf, THIS_USER, TYPE_CERTIFICATE, TYPE_USER } from './words';

function Frame({ title, children }: { title: string; children: ComponentChildren }) {
    const dialog = useRef<HTMLDialogElement>(null);
    useEffect(() => {
        const opener = document.activeElement as HTMLElement | null;
        const shown = dialog.current!;
        shown.showModal();
        return () => {
            shown.close();
            opener?.focus();
        };
    }, []);
    return (
        <dialog class="dialog" ref={dialog} aria-labelledby="dialog-title" onCancel={closeDialog}>
            <h2 id="dialog-title">{title}</h2>
            {children}
        </dialog>
    );
}

function useRealms(): string[] {
    const networks = useServiceState((state) => state.networks) ?? [];
    return [...new Set(networks.flatMap((network) => network.realms.map((realm) => realm.name)))].sort();
}

/** What is being written, what is wrong with it, and the way to store it. */
function useForm({ before, form: first }: OpenDialog) {
    const service = useService();
    const all = useServiceState((state) => state.credentials) ?? [];
    const [form, setForm] = useState<Credential>(first);
    const [objections, setObjections] = useState<Objections>({});
    const [failure, setFailure] = useState('');
    const [isBusy, setBusy] = useState(false);

    const change = (part: Partial<Credential>) => {
        const next = { ...form, ...part };
        setForm(next);
        // What was objected to is looked at again at once; what is new only when it is to be stored.
        const left = objectionsTo(next, all, before);
        setObjections(Object.fromEntries(Object.entries(left).filter(([field]) => field in objections)));
    };
    const submit = async (event: SubmitEvent) => {
        event.preventDefault();
        const shape = event.currentTarget as HTMLFormElement;
        const found = objectionsTo(form, all, before);
        setObjections(found);
        setFailure('');
        const [bad] = fieldsOf(form.Type).filter((field) => found[field]);
        if (bad) return shape.querySelector<HTMLElement>(`[name=${bad}]`)?.focus();
        const wanted = wantedOf(form, before);
        setBusy(true);
        const result = await carryOut(service, before ? edit(wanted) : addition(wanted, all));
        setBusy(false);
        if (!result.isDone) return setFailure(result.why);
        announce(`${nameOf(wanted)} was ${before ? 'changed' : 'stored'}.`);
        closeDialog();
    };
    return { form, objections, failure, isBusy, change, submit };
}

/** Adds a credential, or edits one. It stays open until the service has taken it. */
export function CredentialDialog({ open }: { open: OpenDialog }) {
    const { before } = open;
    const { form, objections, failure, isBusy, change, submit } = useForm(open);
    const canCommand = useCanCommand();
    const realms = useRealms();
    return (
        <Frame title={before ? `Edit ${nameOf(before)}` : 'Add a credential'}>
            <form onSubmit={submit} noValidate>
                <Choice
                    legend="Type"
                    name="type"
                    value={form.Type}
                    options={[
                        [TYPE_USER, 'User name and password'],
                        [TYPE_CERTIFICATE, 'Certificate'],
                    ]}
                    isFixed={before !== null}
                    onChoose={(Type) => change({ Type })}
                />
                {fieldsOf(form.Type).map((field) => (
                    <TextField
                        key={field}
                        field={field}
                        value={form[field]}
                        objection={objections[field]}
                        isKept={field === 'Password' && Boolean(before?.Password)}
                        realms={realms}
                        onInput={(value) => change({ [field]: value })}
                    />
                ))}
                <Choice
                    legend="For"
                    name="access"
                    value={form.AccessType}
                    options={[
                        [ALL_USERS, 'All users of this machine'],
                        [THIS_USER, 'This user only'],
                    ]}
                    isFixed={before !== null}
                    onChoose={(AccessType) => change({ AccessType })}
                />
                <label class="check">
                    <input
                        type="checkbox"
                        checked={form.AutoConnect}
                        onChange={(event) => change({ AutoConnect: event.currentTarget.checked })}
                    />
                    The service may join with it by itself
                </label>
                <p class="bad failure" role="alert">
                    {failure}
                </p>
                <div class="bar dialog-acts">
                    <button type="button" class="button" onClick={closeDialog}>
                        Cancel
                    </button>
                    <button type="submit" class="button primary" disabled={isBusy || !canCommand}>
                        {before ? 'Save' : 'Add'}
                    </button>
                </div>
            </form>
        </Frame>
    );
}
