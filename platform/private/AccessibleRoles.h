// What our widgets are called over the accessibility bus. Only for the layer's own sources.
#pragma once

// The toolkit calls every widget that is no control of its own a mere filler, which screen readers pass over.
// From here on windows are windows or dialogs, a view with an accessible description is a picture, and the
// parts of a view are its children. To be called once the toolkit is there.
void NameAccessibleRoles();
