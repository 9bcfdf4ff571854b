// Identifiers of the resources, in ranges per dialog. Included by the resource compiler too: only
// #define lines.
#pragma once
