/** The stored credentials. */
export function CredentialsView() {
    return <h2>Credentials</h2>;
}
