// The engine with the compiled module of this package.
import createModule from './engine.cjs';
import { packed } from './packed.mjs';
import { openWith, VtsymError } from './vtsym.mjs';

export { VtsymError };

export const open = () => openWith(createModule, packed);
