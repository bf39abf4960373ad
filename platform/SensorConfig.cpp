/** The vendor's sensor configuration library, of which only this flag is used: detailed logging. */
extern int mLogSwitch;
int mLogSwitch = 0;
