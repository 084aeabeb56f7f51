import type { ComponentChildren } from 'preact';
import { useEffect, useRef, useState } from 'preact/hooks';
import { announce } from '../app/notices';
import { useCanCommand, useService, useServiceState } from '../app/service';
import type { Credential } from '../app/state';
import { addition, carryOut, edit } from './changes';
import { closeDialog, type OpenDialog } from './dialogs';
import { fieldsOf, objectionsTo, wantedOf, type Field, type Objections } from './form';
import { ALL_USERS, nameOf, THIS_USER, TYPE_CERTIFICATE, TYPE_USER } from './words';

const LABELS: Record<Field, string> = {
    RealName: 'Realm',
    CredentialName: 'Name',
    Username: 'User name',
    Password: 'Password',
    ClientCert: 'Client certificate',
    CaCert: 'CA certificate',
};

const HINTS: Partial<Record<Field, string>> = {
    RealName: 'As the networks announce it, letter for letter',
    CredentialName: 'The realm, if empty',
    ClientCert: 'Its name in the system’s store',
    CaCert: 'Of the provider’s server; empty for none',
};

interface FieldProps {
    field: Field;
    value: string;
    objection?: string;
    hint?: string;
    realms: readonly string[];
    onInput(value: string): void;
}

function TextField({ field, value, objection, hint, realms, onInput }: FieldProps) {
    const [isSeen, setSeen] = useState(false);
    const isPassword = field === 'Password';
    return (
        <div class="field">
            <label for={`field-${field}`}>{LABELS[field]}</label>
            <div class="field-input">
                <input
                    class="input"
                    id={`field-${field}`}
                    name={field}
                    type={(isPassword && !isSeen ? 'password' : 'text') as 'text'}
                    autocomplete={isPassword ? 'new-password' : 'off'}
                    spellcheck={false}
                    list={field === 'RealName' ? 'realms-in-range' : undefined}
                    value={value}
                    aria-invalid={objection !== undefined}
                    aria-describedby={`about-${field}`}
                    onInput={(event) => onInput(event.currentTarget.value)}
                />
                {isPassword && (
                    <button type="button" class="button small" aria-pressed={isSeen} onClick={() => setSeen(!isSeen)}>
                        Show
                    </button>
                )}
            </div>
            {field === 'RealName' && (
                <datalist id="realms-in-range">
                    {realms.map((realm) => (
                        <option key={realm} value={realm} />
                    ))}
                </datalist>
            )}
            <p id={`about-${field}`} class={objection ? 'bad' : 'muted'}>
                {objection ? `${LABELS[field]} ${objection}.` : hint}
            </p>
        </div>
    );
}

interface ChoiceProps {
    legend: string;
    name: string;
    value: number;
    options: readonly [number, string][];
    isFixed: boolean;
    onChoose(value: number): void;
}

function Choice({ legend, name, value, options, isFixed, onChoose }: ChoiceProps) {
    return (
        <fieldset class="field choice" disabled={isFixed}>
            <legend>{legend}</legend>
            {options.map(([option, label]) => (
                <label key={option} class="check">
                    <input type="radio" name={name} checked={value === option} onChange={() => onChoose(option)} />
                    {label}
                </label>
            ))}
        </fieldset>
    );
}

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

/** Adds a credential, or edits one. It stays open until the service has taken it. */
export function CredentialDialog({ open: { before, form: first } }: { open: OpenDialog }) {
    const service = useService();
    const canCommand = useCanCommand();
    const all = useServiceState((state) => state.credentials) ?? [];
    const realms = useRealms();
    const [form, setForm] = useState<Credential>(first);
    const [objections, setObjections] = useState<Objections>({});
    const [failure, setFailure] = useState('');
    const [isBusy, setBusy] = useState(false);
    const shape = useRef<HTMLFormElement>(null);

    const change = (part: Partial<Credential>) => {
        const next = { ...form, ...part };
        setForm(next);
        // What was objected to is looked at again at once; what is new only when it is to be stored.
        const left = objectionsTo(next, all, before);
        setObjections(Object.fromEntries(Object.entries(left).filter(([field]) => field in objections)));
    };
    const submit = async (event: Event) => {
        event.preventDefault();
        const found = objectionsTo(form, all, before);
        setObjections(found);
        setFailure('');
        const [bad] = fieldsOf(form.Type).filter((field) => found[field]);
        if (bad) return shape.current?.querySelector<HTMLElement>(`[name=${bad}]`)?.focus();
        const wanted = wantedOf(form, before);
        setBusy(true);
        const result = await carryOut(service, before ? edit(wanted) : addition(wanted, all));
        setBusy(false);
        if (!result.isDone) return setFailure(result.why);
        announce(`${nameOf(wanted)} was ${before ? 'changed' : 'stored'}.`);
        closeDialog();
    };
    const hint = (field: Field) =>
        field === 'Password' && before?.Password ? 'Empty: the stored one stays' : HINTS[field];
    return (
        <Frame title={before ? `Edit ${nameOf(before)}` : 'Add a credential'}>
            <form ref={shape} onSubmit={submit} noValidate>
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
                        hint={hint(field)}
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
