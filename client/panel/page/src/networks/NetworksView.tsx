/** The networks in range. */
export function NetworksView() {
    return <h2>Networks</h2>;
}
