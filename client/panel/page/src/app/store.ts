import { useLayoutEffect, useReducer, useRef } from 'preact/hooks';

/** A value that tells when it is replaced. */
export class Store<T> {
    #value: T;
    #listeners = new Set<() => void>();

    constructor(value: T) {
        this.#value = value;
    }

    get(): T {
        return this.#value;
    }

    set(value: T): void {
        if (Object.is(value, this.#value)) return;
        this.#value = value;
        for (const listener of [...this.#listeners]) listener();
    }

    update(change: (value: T) => T): void {
        this.set(change(this.#value));
    }

    subscribe(listener: () => void): () => void {
        this.#listeners.add(listener);
        return () => this.#listeners.delete(listener);
    }
}

/** What `select` takes of the store. The component is drawn anew when that is another value (Object.is). */
export function useStore<T, S>(store: Store<T>, select: (value: T) => S): S {
    const [, redraw] = useReducer((count: number) => count + 1, 0);
    const selected = select(store.get());
    const shown = useRef({ selected, select });
    shown.current = { selected, select };
    useLayoutEffect(() => {
        const look = () => {
            if (!Object.is(shown.current.select(store.get()), shown.current.selected)) redraw(0);
        };
        look();
        return store.subscribe(look);
    }, [store]);
    return selected;
}
