// How the toolkit's controls look. Only for the layer's own sources.
#pragma once

// Controls in light colours, black on grey and white, whatever the desktop's theme: they stand between what
// views paint in colours of their own. The person's fonts are left alone. To be called once the toolkit is
// there, before any widget.
void SetLook();
