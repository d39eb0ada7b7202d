int unusedPlaceholder;
