import { HIDDEN_PASSWORD } from '../app/protocol';
import type { Credential } from '../app/state';
import { METHOD_TLS, METHOD_TTLS, realmBytes } from './matching';
import { ALL_USERS, nameOf, TYPE_CERTIFICATE, TYPE_USER } from './words';

export type Field = 'CredentialName' | 'RealName' | 'Username' | 'Password' | 'ClientCert' | 'CaCert';

/** In UTF-16 units, as the service counts; it cuts what is longer. */
export const LIMITS: Record<Field, number> = {
    CredentialName: 127,
    RealName: 127,
    Username: 63,
    Password: 63,
    ClientCert: 127,
    CaCert: 127,
};

export type Objections = Partial<Record<Field, string>>;

export const EMPTY: Credential = {
    Id: 0,
    Type: TYPE_USER,
    AccessType: ALL_USERS,
    CredentialEapMethod: METHOD_TTLS,
    AutoConnect: true,
    CredentialName: '',
    RealName: '',
    Creator: '',
    CaCert: '',
    ClientCert: '',
    Username: '',
    Password: '',
};

/** What the form begins with for an edit: a password stays where none is given. */
export function formOf(credential: Credential): Credential {
    return { ...credential, Password: '' };
}

/** The members that belong to its type, as the command takes them. `before`: what is edited, null for an addition. */
export function wantedOf(form: Credential, before: Credential | null): Credential {
    const isUser = form.Type === TYPE_USER;
    const realm = form.RealName.trim();
    return {
        ...form,
        CredentialEapMethod: isUser ? METHOD_TTLS : METHOD_TLS,
        RealName: realm,
        CredentialName: form.CredentialName.trim() || realm,
        Username: isUser ? form.Username : '',
        Password: isUser ? form.Password || before?.Password || '' : '',
        ClientCert: isUser ? '' : form.ClientCert,
        CaCert: isUser ? '' : form.CaCert,
    };
}

function textObjection(field: Field, text: string): string | null {
    if (/[\u0000-\u001f\u007f]/.test(text)) return 'holds a control character';
    if (/\p{Surrogate}|[\ufffe\uffff]/u.test(text)) return 'holds a character that cannot be stored';
    if (text.length > LIMITS[field]) return `is longer than ${LIMITS[field]} characters`;
    return null;
}

/** The fields of a credential of this type. */
export function fieldsOf(type: number): readonly Field[] {
    const own: readonly Field[] = type === TYPE_CERTIFICATE ? ['ClientCert', 'CaCert'] : ['Username', 'Password'];
    return ['RealName', 'CredentialName', ...own];
}

const MISSING: Partial<Record<Field, string>> = {
    RealName: 'is needed: without one it fits no network',
    Username: 'is needed: without one it fits no network',
    Password: 'is needed: without one it fits no network',
};

/** Which other one has the realm for its type, or the name. What it was before it may stay. */
export function clashOf(wanted: Credential, all: readonly Credential[], before: Credential | null): Objections {
    const others = all.filter((other) => other.Id !== (before?.Id ?? 0));
    const found: Objections = {};
    if (wanted.RealName !== before?.RealName) {
        const other = others.find((one) => one.Type === wanted.Type && one.RealName === wanted.RealName);
        if (other) found.RealName = `has ${nameOf(other)} of this type already`;
    }
    if (wanted.CredentialName !== before?.CredentialName) {
        const other = others.find((one) => one.CredentialName === wanted.CredentialName);
        if (other) found.CredentialName = `is taken by the credential for ${other.RealName}`;
    }
    return found;
}

/** What keeps the service from storing it as it is wanted; each goes on where the field's label ends. */
export function objectionsTo(form: Credential, all: readonly Credential[], before: Credential | null): Objections {
    const wanted = wantedOf(form, before);
    const found: Objections = clashOf(wanted, all, before);
    for (const field of fieldsOf(wanted.Type)) {
        const objection = wanted[field] === '' ? MISSING[field] : textObjection(field, wanted[field]);
        if (objection) found[field] = objection;
    }
    if (!found.RealName && realmBytes(wanted.RealName) === null)
        found.RealName = 'holds a character beyond Latin-1: the service can compare it with no network';
    if (form.Password === HIDDEN_PASSWORD) found.Password = 'cannot be eight asterisks here: they stand for the stored one';
    return found;
}
