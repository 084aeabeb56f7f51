import { useState } from 'preact/hooks';
import type { Field } from './form';

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
    /** What is stored stays if it is empty. */
    isKept: boolean;
    realms: readonly string[];
    onInput(value: string): void;
}

export function TextField({ field, value, objection, isKept, realms, onInput }: FieldProps) {
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
                {objection ? `${LABELS[field]} ${objection}.` : isKept ? 'Empty: the stored one stays' : HINTS[field]}
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

export function Choice({ legend, name, value, options, isFixed, onChoose }: ChoiceProps) {
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
