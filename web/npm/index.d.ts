/** Languages of conditions: C, Quill, or (only to write) preprocessor directives. */
export type Language = 'c' | 'quill' | 'pp';

export interface LanguageOptions {
    from?: 'c' | 'quill';
    to?: Language;
    /** Conditions that hold; answers are for the values for which they do. */
    assume?: string | string[];
    /** Take names for signed integers of 32 bits. */
    bits?: 32;
}

export interface SimplifyOptions extends LanguageOptions {
    /** Answer with the sum of products that the rules lead to, instead of the shortest form. */
    normalForm?: boolean;
    /** Record the steps. */
    explain?: boolean;
}

export interface Step {
    pass?: number;
    rule?: string;
    before?: string;
    after?: string;
    form?: string;
    way?: string;
    comparisons?: number;
    bytes?: number;
    chosen?: boolean;
}

export interface Simplified {
    result: string;
    passes: number;
    steps?: Step[];
}

/** Values of names; an integer beyond 2^53 loses digits in JSON. */
export type Assignment = Record<string, number | string>;

export interface Relation {
    relation: 'equivalent' | 'disjoint' | 'implies' | 'implied by' | 'overlaps' | 'undecided';
    witness?: { only_a?: Assignment; only_b?: Assignment; both?: Assignment };
    /** Operands that force the relation; it does not follow without any one of them. */
    because?: string[];
}

export interface TreeNode {
    kind: string;
    op: number;
    id: number;
    text?: string;
    value?: number | boolean | string;
    inputs?: (TreeNode | number)[];
}

export interface Finding {
    file: string;
    line: number;
    kind: string;
    name: string;
    condition: string;
    proposed?: string;
    witness?: string;
    because?: string[];
    follows?: { line: number; name: string; text: string }[];
}

/** An engine.  Functions throw VtsymError for texts without an answer. */
export interface Vtsym {
    readonly version: string;
    /** Runs a command line of the program with a standard input. */
    run(args: string[], input?: string): { status: number; out: string; err: string };
    simplify(text: string, options?: SimplifyOptions): Simplified;
    compare(a: string, b: string, options?: LanguageOptions): Relation;
    given(known: string, condition: string, options?: LanguageOptions): { result: string };
    convert(text: string, options?: LanguageOptions): string;
    tree(text: string, options?: LanguageOptions): TreeNode;
    symbols(text: string, options?: LanguageOptions): string[];
    evaluate(text: string, values?: Record<string, number | string>, options?: LanguageOptions): unknown;
    /** The findings of a model: its JSON text or its object. */
    check(model: string | object): Finding[];
    /** The same as sentences, each after `/model.json:LINE: `. */
    checkText(model: string | object): string[];
    /** A self-contained HTML page about a model. */
    checkPage(model: string | object): string;
}

export class VtsymError extends Error {
    /** The byte of the text where reading stopped. */
    readonly offset?: number;
    readonly id?: string;
}

/** Starts an engine; keep it. */
export function open(): Promise<Vtsym>;
