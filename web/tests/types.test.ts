// Compiles where the types of the npm package say what its functions take and return.
import { open, Relation, Step, VtsymError } from 'vtsym';

async function everything(): Promise<void> {
    const vtsym = await open();
    const steps: Step[] | undefined = vtsym.simplify('A', { explain: true, assume: 'A > 1', bits: 32 }).steps;
    const relation: Relation['relation'] = vtsym.compare('A', 'B', { from: 'quill' }).relation;
    const value: number | string | undefined = vtsym.compare('A', 'B').witness?.only_a?.A;
    const names: string[] = vtsym.symbols(vtsym.given('A', 'B').result);
    const lines: number[] = vtsym.check({ children: [] }).map((finding) => finding.line);
    const sentences: string[] = vtsym.checkText('{}');
    const { status, out }: { status: number; out: string } = vtsym.run(['--help']);
    const offset: number | undefined = new VtsymError().offset;
    // @ts-expect-error a language that there is not
    vtsym.convert('A', { to: 'pascal' });
    void [steps, relation, value, names, lines, sentences, status, out, offset];
}

void everything;
