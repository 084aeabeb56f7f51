/** Recordings: made, and played back. */
export function RecordView() {
    return <h2>Record</h2>;
}
