interface Props<T> {
    label: string;
    choices: readonly { value: T; label: string }[];
    chosen: T;
    onChoose(value: T): void;
}

/** A few choices side by side. */
export function Choices<T>({ label, choices, chosen, onChoose }: Props<T>) {
    return (
        <div class="choices" role="group" aria-label={label}>
            {choices.map((choice) => (
                <button
                    key={choice.label}
                    type="button"
                    class="button"
                    aria-pressed={choice.value === chosen}
                    onClick={() => onChoose(choice.value)}
                >
                    {choice.label}
                </button>
            ))}
        </div>
    );
}
